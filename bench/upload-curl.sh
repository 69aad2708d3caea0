#!/bin/sh
# curl sending FILE the way a resumable upload is sent in one piece: a
# session, then the whole file in one PUT. Uses TAMSEL_YOUTUBE_API_URL and the
# access token TAMSEL_BENCH_ACCESS_TOKEN.
set -eu
file=$1
size=$(stat -c %s "$file")
location=$(curl -sS -o /dev/null -D - -X POST \
  "$TAMSEL_YOUTUBE_API_URL/upload/youtube/v3/videos?uploadType=resumable&part=snippet,status" \
  -H "Authorization: Bearer $TAMSEL_BENCH_ACCESS_TOKEN" \
  -H "Content-Type: application/json; charset=UTF-8" \
  -H "X-Upload-Content-Length: $size" -H "X-Upload-Content-Type: video/mp4" \
  --data '{"snippet":{"title":"Benchmark"},"status":{"privacyStatus":"private"}}' |
  tr -d '\r' | sed -n 's/^[Ll]ocation: //p')
curl -sS -f -o /dev/null -X PUT -T "$file" -H "Expect:" \
  -H "Authorization: Bearer $TAMSEL_BENCH_ACCESS_TOKEN" -H "Content-Type: video/mp4" \
  -H "Content-Range: bytes 0-$((size - 1))/$size" "$location"

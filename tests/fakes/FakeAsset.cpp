#include "FakeAsset.h"

#include "platform/runtime/DevicePaths.h"

#include <cerrno>

using namespace platform;

namespace fakes {

FakeAsset::FakeAsset(const QUrl& url, const std::optional<FakeMovie>& movie)
    : url_(url), hostPath_(DevicePaths::hostPathOfUrl(url)) {
    if (!movie) {
        error_ = makeError(-ENOENT, mediaErrorDomain(),
                           QStringLiteral("%1: No such file or directory").arg(url.toString()));
        return;
    }
    duration_ = MediaTime::fromSeconds(movie->seconds, 600);
    if (movie->video) {
        AssetTrack track;
        track.trackID = 1;
        track.mediaType = MediaType::Video;
        track.naturalSize = QSizeF(movie->size);
        track.preferredTransform = QTransform().rotate(movie->rotationDegrees);
        track.naturalTimeScale = 600;
        track.timeRange = MediaTimeRange::make(MediaTime::make(0, 600), duration_);
        track.nominalFrameRate = 30;
        tracks_.append(track);
    }
    AssetTrack audio;
    audio.trackID = int(tracks_.size()) + 1;
    audio.mediaType = MediaType::Audio;
    audio.naturalTimeScale = 48000;
    audio.timeRange = MediaTimeRange::make(MediaTime::make(0, 48000),
                                           MediaTime::fromSeconds(movie->seconds, 48000));
    tracks_.append(audio);
}

} // namespace fakes

#pragma once

#include "platform/media/MediaTime.h"
#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QList>
#include <QSizeF>
#include <QTransform>
#include <QUrl>

#include <cstdint>
#include <memory>

namespace platform {

enum class MediaType { Video, Audio };

// One video or audio track of an asset, as its headers describe it.
struct AssetTrack {
    int trackID = 0; // 1-based, in stream order
    MediaType mediaType = MediaType::Video;
    QSizeF naturalSize;            // coded size, before the transform
    QTransform preferredTransform; // from the display matrix (rotation)
    std::int32_t naturalTimeScale = 0;
    MediaTimeRange timeRange;
    double nominalFrameRate = 0;
};

// A movie file and what its headers say: the tracks, in stream order, and the
// duration. Times count from the movie's earliest sample (whatever its
// timestamps start at), as the player's do. Immutable once made, so any
// thread may read it. Streams other than video and audio (data, subtitles,
// cover art) are not tracks.
class Asset {
  public:
    virtual ~Asset() = default;

    // An asset from implementation(): the real one, reading the headers with
    // FFmpeg, unless a test replaced it. Opens the URL (device paths are
    // mapped) and reads its headers synchronously; never null. Something that
    // is not a movie gives an asset without tracks, with error() set: so does
    // a path that is not a regular file (refused before anything reads it)
    // and a file whose headers do not come within a bound of a few seconds.
    // Callable from any thread, the main thread included.
    static std::shared_ptr<Asset> assetWithURL(const QUrl& url);
    using Maker = std::shared_ptr<Asset>(const QUrl&);
    static Implementation<Maker>& implementation();

    virtual const QUrl& url() const = 0;
    // The host path the URL maps to (empty for a URL that is not a file).
    virtual const QString& hostPath() const = 0;
    // A path that reads the file the asset opened for as long as the asset
    // lives, even once the file is removed or replaced (the asset keeps it
    // open): what readers of the asset's samples open. The host path when the
    // file could not be kept open (not a regular file).
    virtual const QString& readablePath() const { return hostPath(); }
    virtual QList<AssetTrack> tracks() const = 0;
    QList<AssetTrack> tracksWithMediaType(MediaType type) const {
        QList<AssetTrack> matching;
        for (const AssetTrack& track : tracks())
            if (track.mediaType == type)
                matching.append(track);
        return matching;
    }
    // The longest track's end, at the first video track's timescale (or the
    // first track's); invalid when there are no tracks.
    virtual MediaTime duration() const = 0;
    // True when there is a track whose codec can be decoded here.
    virtual bool isPlayable() const = 0;
    // Why the asset has no tracks; null when it opened.
    virtual ErrorPtr error() const = 0;
};

// The error domain of the media services; codes are FFmpeg's AVERROR values
// (negative) or the errno of a file operation (negated).
inline const QString& mediaErrorDomain() {
    static const QString domain = QStringLiteral("TamselMediaErrorDomain");
    return domain;
}

} // namespace platform

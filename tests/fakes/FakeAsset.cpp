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
    duration_ = MediaTime::fromSeconds(movie->seconds, movie->timescale);
    if (movie->video) {
        AssetTrack video;
        video.trackID = 1;
        video.mediaType = MediaType::Video;
        video.naturalSize = QSizeF(movie->size);
        video.preferredTransform = QTransform().rotate(movie->rotationDegrees);
        video.naturalTimeScale = movie->timescale;
        video.timeRange = MediaTimeRange::make(MediaTime::make(0, movie->timescale), duration_);
        video.nominalFrameRate = 30;
        tracks_.append(video);
    }
    if (movie->audio) {
        AssetTrack audio;
        audio.trackID = int(tracks_.size()) + 1;
        audio.mediaType = MediaType::Audio;
        audio.naturalTimeScale = 48000;
        audio.timeRange = MediaTimeRange::make(MediaTime::make(0, 48000),
                                               MediaTime::fromSeconds(movie->seconds, 48000));
        tracks_.append(audio);
    }
}

} // namespace fakes

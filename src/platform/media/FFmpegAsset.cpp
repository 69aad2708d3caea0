#include "FFmpegAsset.h"

#include "FFmpegHandles.h"
#include "StreamTime.h"
#include "platform/runtime/Bounded.h"
#include "platform/runtime/DevicePaths.h"

#include <QFile>
#include <QFileInfo>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

extern "C" {
#include <libavutil/display.h>
}

namespace platform {
namespace {

// The display matrix holds a, b, c, d, tx, ty as 16.16 fixed point at
// indices 0, 1, 3, 4, 6, 7 and maps (x, y) to (a·x + c·y + tx, b·x + d·y + ty),
// which is QTransform's own convention.
QTransform transformOf(const AVStream* stream) {
    size_t size = 0;
    const auto* m = reinterpret_cast<const std::int32_t*>(
        av_stream_get_side_data(stream, AV_PKT_DATA_DISPLAYMATRIX, &size));
    if (!m || size < 9 * sizeof(std::int32_t))
        return {};
    const double one = 1 << 16;
    return QTransform(m[0] / one, m[1] / one, m[3] / one, m[4] / one, m[6] / one, m[7] / one);
}

double frameRateOf(const AVStream* stream) {
    if (stream->avg_frame_rate.num > 0 && stream->avg_frame_rate.den > 0)
        return av_q2d(stream->avg_frame_rate);
    if (stream->r_frame_rate.num > 0 && stream->r_frame_rate.den > 0)
        return av_q2d(stream->r_frame_rate);
    return 0;
}

} // namespace

Implementation<Asset::Maker>& Asset::implementation() {
    static Implementation<Maker> chosen(
        [](const QUrl& url) -> std::shared_ptr<Asset> { return FFmpegAsset::open(url); });
    return chosen;
}

std::shared_ptr<Asset> Asset::assetWithURL(const QUrl& url) {
    return implementation().make(url);
}

std::shared_ptr<FFmpegAsset> FFmpegAsset::open(const QUrl& url) {
    // The caller may be the main thread, and a file can stall (a network
    // share that went away): the headers are read on a thread of their own,
    // and waited for only so long.
    if (auto asset = runWithin<std::shared_ptr<FFmpegAsset>>(kHeaderBound,
                                                             [url] { return readHeaders(url); }))
        return *asset;
    std::shared_ptr<FFmpegAsset> asset(new FFmpegAsset);
    asset->url_ = url;
    asset->hostPath_ = DevicePaths::hostPathOfUrl(url);
    asset->error_ =
        makeError(AVERROR(ETIMEDOUT), mediaErrorDomain(),
                  QStringLiteral("%1 did not answer within %2 s")
                      .arg(url.isLocalFile() ? url.toLocalFile() : url.toString())
                      .arg(std::chrono::duration_cast<std::chrono::seconds>(kHeaderBound).count()));
    return asset;
}

std::shared_ptr<FFmpegAsset> FFmpegAsset::readHeaders(const QUrl& url) {
    std::shared_ptr<FFmpegAsset> asset(new FFmpegAsset);
    asset->url_ = url;
    asset->hostPath_ = DevicePaths::hostPathOfUrl(url);
    const QString shownPath = url.isLocalFile() ? url.toLocalFile() : url.toString();
    if (asset->hostPath_.isEmpty()) {
        asset->error_ = makeError(AVERROR(EINVAL), mediaErrorDomain(),
                                  QStringLiteral("not a file URL: %1").arg(shownPath));
        return asset;
    }
    // The editor removes a clip while the asset made on it still serves the
    // next export: the asset keeps its file open and reads through the
    // descriptor. Opened without blocking, and kept only for a regular file.
    asset->readablePath_ = asset->hostPath_;
    const int fd =
        ::open(QFile::encodeName(asset->hostPath_).constData(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    struct stat info {};
    if (fd >= 0 && ::fstat(fd, &info) == 0 && S_ISREG(info.st_mode)) {
        asset->descriptor_ = fd;
        asset->readablePath_ = QStringLiteral("/proc/self/fd/%1").arg(fd);
    } else if (fd >= 0) {
        ::close(fd);
    }
    int err = 0;
    ffmpeg::InputPtr input = ffmpeg::openInput(asset->readablePath_, &err);
    if (!input) {
        asset->error_ = makeError(err, mediaErrorDomain(),
                                  QStringLiteral("%1: %2").arg(shownPath, ffmpeg::errorText(err)));
        return asset;
    }

    // Times count from the movie's earliest sample, as players count them: a
    // capture remuxed from a stream may start its timestamps anywhere.
    const MediaTime movieStart = input->start_time == AV_NOPTS_VALUE
                                     ? MediaTime::zero()
                                     : StreamTime::toMediaTime(input->start_time, AV_TIME_BASE_Q);
    MediaTime end = MediaTime::invalid();
    std::int32_t durationScale = 0;
    for (unsigned i = 0; i < input->nb_streams; ++i) {
        const AVStream* stream = input->streams[i];
        const AVCodecParameters* p = stream->codecpar;
        const bool video = p->codec_type == AVMEDIA_TYPE_VIDEO &&
                           !(stream->disposition & AV_DISPOSITION_ATTACHED_PIC);
        if (!video && p->codec_type != AVMEDIA_TYPE_AUDIO)
            continue;
        AssetTrack track;
        track.trackID = static_cast<int>(i) + 1;
        track.mediaType = video ? MediaType::Video : MediaType::Audio;
        track.naturalTimeScale = StreamTime::timescaleOf(stream->time_base);
        if (video) {
            track.naturalSize = QSizeF(p->width, p->height);
            track.preferredTransform = transformOf(stream);
            track.nominalFrameRate = frameRateOf(stream);
        }
        const std::int64_t start = stream->start_time == AV_NOPTS_VALUE ? 0 : stream->start_time;
        std::int64_t length = stream->duration;
        if (length == AV_NOPTS_VALUE && input->duration != AV_NOPTS_VALUE)
            length = StreamTime::rescale(input->duration, AV_TIME_BASE_Q, stream->time_base);
        track.timeRange =
            MediaTimeRange::make(StreamTime::toMediaTime(start, stream->time_base) - movieStart,
                                 StreamTime::toMediaTime(length, stream->time_base));
        if (track.timeRange.isValid()) {
            if (!end.isValid() || track.timeRange.end() > end)
                end = track.timeRange.end();
            if (durationScale == 0 ||
                (video && asset->tracksWithMediaType(MediaType::Video).isEmpty()))
                durationScale = track.naturalTimeScale;
        }
        if (avcodec_find_decoder(p->codec_id))
            asset->playable_ = true;
        asset->tracks_.append(track);
    }
    if (end.isValid())
        asset->duration_ = end.convertScale(durationScale);
    if (asset->tracks_.isEmpty())
        asset->error_ = makeError(AVERROR_STREAM_NOT_FOUND, mediaErrorDomain(),
                                  QStringLiteral("%1: no video or audio track").arg(shownPath));
    return asset;
}

FFmpegAsset::~FFmpegAsset() {
    if (descriptor_ >= 0)
        ::close(descriptor_);
}

const QString& FFmpegAsset::readablePath() const {
    return readablePath_;
}

const QUrl& FFmpegAsset::url() const {
    return url_;
}
const QString& FFmpegAsset::hostPath() const {
    return hostPath_;
}
QList<AssetTrack> FFmpegAsset::tracks() const {
    return tracks_;
}
MediaTime FFmpegAsset::duration() const {
    return duration_;
}
bool FFmpegAsset::isPlayable() const {
    return playable_;
}
ErrorPtr FFmpegAsset::error() const {
    return error_;
}

} // namespace platform

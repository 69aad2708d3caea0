#include "FakeExportSession.h"

#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"

#include <QDir>
#include <QFileInfo>

#include <cerrno>

using namespace platform;

namespace fakes {

namespace {
ErrorPtr invalid(const QString& what) {
    return makeError(-EINVAL, mediaErrorDomain(), what);
}
} // namespace

FakeExportSession::FakeExportSession(std::shared_ptr<Asset> asset, QString presetName,
                                     std::shared_ptr<FakeWorld> world)
    : asset_(std::move(asset)), preset_(std::move(presetName)), world_(std::move(world)) {}

QUrl FakeExportSession::outputURL() const {
    std::lock_guard lock(mutex_);
    return outputURL_;
}
void FakeExportSession::setOutputURL(const QUrl& url) {
    std::lock_guard lock(mutex_);
    outputURL_ = url;
}
QString FakeExportSession::outputFileType() const {
    std::lock_guard lock(mutex_);
    return fileType_;
}
void FakeExportSession::setOutputFileType(const QString& fileType) {
    std::lock_guard lock(mutex_);
    fileType_ = fileType;
}
MediaTimeRange FakeExportSession::timeRange() const {
    std::lock_guard lock(mutex_);
    if (range_)
        return *range_;
    return MediaTimeRange::make(MediaTime::zero(),
                                asset_ ? asset_->duration() : MediaTime::invalid());
}
void FakeExportSession::setTimeRange(const MediaTimeRange& range) {
    std::lock_guard lock(mutex_);
    range_ = range;
}
std::optional<AudioMix> FakeExportSession::audioMix() const {
    std::lock_guard lock(mutex_);
    return audioMix_;
}
void FakeExportSession::setAudioMix(const std::optional<AudioMix>& mix) {
    std::lock_guard lock(mutex_);
    audioMix_ = mix;
}
ErrorPtr FakeExportSession::error() const {
    std::lock_guard lock(mutex_);
    return error_;
}

void FakeExportSession::exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) {
    if (started_.exchange(true)) {
        logError(QStringLiteral("ExportSession: an export session exports only once"));
        return;
    }
    status_ = int(ExportSessionStatus::Waiting);
    GlobalQueue::async(QueuePriority::Default,
                       [self = shared_from_this(), handler = std::move(handler)] {
                           self->run();
                           if (handler)
                               handler();
                       });
}

void FakeExportSession::run() {
    status_ = int(ExportSessionStatus::Exporting);
    MediaTimeRange clipped;
    ErrorPtr failure = check(&clipped);
    world_->recordExport(
        {asset_ ? asset_->url() : QUrl(), preset_, outputURL(), outputFileType(), timeRange()});
    auto [status, code] = world_->exportOutcome();
    if (cancelled_)
        status = ExportSessionStatus::Cancelled;
    if (!failure && status == ExportSessionStatus::Failed)
        failure = makeError(code, mediaErrorDomain(), QStringLiteral("the export failed"));
    if (failure && status != ExportSessionStatus::Cancelled)
        status = ExportSessionStatus::Failed;
    if (status == ExportSessionStatus::Completed) {
        std::optional<FakeMovie> clip = world_->movieAt(asset_->url());
        clip->seconds = clipped.duration.seconds();
        world_->addMovie(outputURL(), *clip);
        progress_ = 1.0f;
    }
    {
        std::lock_guard lock(mutex_);
        error_ = status == ExportSessionStatus::Failed ? failure : nullptr;
    }
    status_ = int(status);
}

ErrorPtr FakeExportSession::check(MediaTimeRange* clipped) const {
    if (!asset_ || asset_->tracks().isEmpty() || !world_->movieAt(asset_->url()))
        return asset_ && asset_->error() ? asset_->error()
                                         : invalid(QStringLiteral("no asset to export"));
    const QString fileType = outputFileType();
    if (!fileType.isEmpty() && fileType != FileTypeMPEG4)
        return invalid(QStringLiteral("unsupported output file type %1").arg(fileType));
    const QUrl url = outputURL();
    const QString outputPath = DevicePaths::hostPathOfUrl(url);
    if (outputPath.isEmpty())
        return invalid(QStringLiteral("no output URL"));
    if (!QFileInfo(outputPath).absoluteDir().exists())
        return posixError(ENOENT, url.toLocalFile());
    const MediaTimeRange requested = timeRange();
    if (!requested.isValid() || !requested.start.isNumeric() || requested.start < MediaTime::zero())
        return invalid(QStringLiteral("invalid time range"));
    MediaTime end = requested.end();
    const MediaTime duration = asset_->duration();
    if (duration.isNumeric() && (!end.isNumeric() || end > duration))
        end = duration;
    if (!end.isNumeric() || end <= requested.start)
        return invalid(QStringLiteral("the time range is empty within the movie"));
    *clipped = MediaTimeRange::fromStartToEnd(requested.start, end);
    return nullptr;
}

} // namespace fakes

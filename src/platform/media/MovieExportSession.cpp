#include "MovieExportSession.h"

#include "ExportJob.h"
#include "FFmpegHandles.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QRandomGenerator>

#include <cerrno>
#include <csignal>
#include <cstdio>

namespace platform {
namespace {

ErrorPtr invalid(const QString& what) {
    return makeError(AVERROR(EINVAL), mediaErrorDomain(), what);
}

// Removes the temporary file on every way out except a completed rename.
class TemporaryOutput {
  public:
    explicit TemporaryOutput(const QString& outputPath) {
        const QFileInfo info(outputPath);
        path_ = info.absoluteDir().filePath(
            QStringLiteral(".%1.%2.part")
                .arg(info.fileName())
                .arg(QRandomGenerator::global()->generate64(), 16, 16, QLatin1Char('0')));
    }
    ~TemporaryOutput() {
        if (!committed_)
            QFile::remove(path_);
    }
    const QString& path() const { return path_; }
    int commitAs(const QString& outputPath) {
        if (std::rename(QFile::encodeName(path_).constData(),
                        QFile::encodeName(outputPath).constData()) != 0)
            return errno;
        committed_ = true;
        return 0;
    }

  private:
    QString path_;
    bool committed_ = false;
};

} // namespace

Implementation<ExportSession::Maker>& ExportSession::implementation() {
    static Implementation<Maker> chosen(
        [](std::shared_ptr<Asset> asset,
           const QString& presetName) -> std::shared_ptr<ExportSession> {
            if (presetName != ExportPresetPassthrough && presetName != ExportPresetHighestQuality)
                return nullptr;
            return std::make_shared<MovieExportSession>(std::move(asset), presetName);
        });
    return chosen;
}

std::shared_ptr<ExportSession>
ExportSession::exportSessionWithAsset_presetName(std::shared_ptr<Asset> asset,
                                                 const QString& presetName) {
    return implementation().make(std::move(asset), presetName);
}

MovieExportSession::MovieExportSession(std::shared_ptr<Asset> asset, QString presetName)
    : asset_(std::move(asset)), preset_(std::move(presetName)) {}

QUrl MovieExportSession::outputURL() const {
    std::lock_guard lock(mutex_);
    return outputURL_;
}

void MovieExportSession::setOutputURL(const QUrl& url) {
    std::lock_guard lock(mutex_);
    outputURL_ = url;
}

QString MovieExportSession::outputFileType() const {
    std::lock_guard lock(mutex_);
    return fileType_;
}

void MovieExportSession::setOutputFileType(const QString& fileType) {
    std::lock_guard lock(mutex_);
    fileType_ = fileType;
}

MediaTimeRange MovieExportSession::timeRange() const {
    std::lock_guard lock(mutex_);
    if (range_)
        return *range_;
    return MediaTimeRange::make(MediaTime::zero(),
                                asset_ ? asset_->duration() : MediaTime::invalid());
}

void MovieExportSession::setTimeRange(const MediaTimeRange& range) {
    std::lock_guard lock(mutex_);
    range_ = range;
}

std::optional<AudioMix> MovieExportSession::audioMix() const {
    std::lock_guard lock(mutex_);
    return audioMix_;
}

void MovieExportSession::setAudioMix(const std::optional<AudioMix>& mix) {
    std::lock_guard lock(mutex_);
    audioMix_ = mix;
}

ErrorPtr MovieExportSession::error() const {
    std::lock_guard lock(mutex_);
    return error_;
}

void MovieExportSession::exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) {
    if (started_.exchange(true)) {
        logError(QStringLiteral("ExportSession: an export session exports only once"));
        return;
    }
    status_ = int(ExportSessionStatus::Waiting);
    auto self = shared_from_this();
    GlobalQueue::async(QueuePriority::Default,
                       [self, handler = std::move(handler)] { self->run(handler); });
}

void MovieExportSession::cancelExport() {
    cancelled_ = true;
}

void MovieExportSession::run(std::function<void()> handler) {
    // A size limit on this process would kill it on the first byte too many;
    // ignored, the write fails and the export with it, as on a full disk.
    std::signal(SIGXFSZ, SIG_IGN);
    if (cancelled_) {
        finish(ExportSessionStatus::Cancelled, nullptr);
    } else {
        status_ = int(ExportSessionStatus::Exporting);
        // A cancel that comes once the clip has its name is too late: the
        // export finished.
        ErrorPtr failure = write();
        if (failure && failure->code() == kExportCancelledCode)
            finish(ExportSessionStatus::Cancelled, nullptr);
        else if (failure)
            finish(ExportSessionStatus::Failed, failure);
        else
            finish(ExportSessionStatus::Completed, nullptr);
    }
    if (handler)
        handler();
}

void MovieExportSession::finish(ExportSessionStatus status, ErrorPtr error) {
    {
        std::lock_guard lock(mutex_);
        error_ = std::move(error);
    }
    if (status == ExportSessionStatus::Completed)
        progress_ = 1.0f;
    status_ = int(status);
}

ErrorPtr MovieExportSession::write() {
    const QUrl url = outputURL();
    const QString fileType = outputFileType();
    const MediaTimeRange requested = timeRange();
    if (!asset_ || asset_->tracks().isEmpty())
        return asset_ && asset_->error() ? asset_->error()
                                         : invalid(QStringLiteral("no asset to export"));
    if (!fileType.isEmpty() && fileType != FileTypeMPEG4)
        return invalid(QStringLiteral("unsupported output file type %1").arg(fileType));
    const QString outputPath = DevicePaths::hostPathOfUrl(url);
    if (outputPath.isEmpty())
        return invalid(QStringLiteral("no output URL"));
    if (!QFileInfo(outputPath).absoluteDir().exists())
        return posixError(ENOENT, url.toLocalFile());

    // Clip at the end of the asset; an invalid, negative or empty range is
    // refused rather than guessed at.
    const MediaTime duration = asset_->duration();
    if (!requested.isValid() || !requested.start.isNumeric() || requested.start < MediaTime::zero())
        return invalid(QStringLiteral("invalid time range %1 + %2")
                           .arg(requested.start.description(), requested.duration.description()));
    MediaTime end = requested.end();
    if (duration.isNumeric() && (!end.isNumeric() || end > duration))
        end = duration;
    if (!end.isNumeric() || end <= requested.start)
        return invalid(QStringLiteral("the time range %1 + %2 is empty within the movie")
                           .arg(requested.start.description(), requested.duration.description()));

    TemporaryOutput temporary(outputPath);
    ExportJob job;
    job.sourcePath = asset_->readablePath();
    job.outputPath = temporary.path();
    job.range = MediaTimeRange::fromStartToEnd(requested.start, end);
    job.audioMix = audioMix();
    job.rule =
        preset_ == ExportPresetPassthrough ? CopyRule::WhatMp4Holds : CopyRule::WhatUploadsAccept;
    job.cancelled = &cancelled_;
    job.progress = [this](float done) { progress_ = std::clamp(done, 0.0f, 0.999f); };
    ErrorPtr failure = runExport(job);
    if (failure)
        return failure;
    if (cancelled_)
        return makeError(kExportCancelledCode, mediaErrorDomain(), QStringLiteral("cancelled"));
    if (const int err = temporary.commitAs(outputPath))
        return posixError(err, url.toLocalFile());
    return nullptr;
}

} // namespace platform

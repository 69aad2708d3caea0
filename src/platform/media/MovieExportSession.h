#pragma once

#include "platform/media/ExportSession.h"

#include <atomic>
#include <mutex>

namespace platform {

// The export session on FFmpeg: a worker job writes a temporary file beside
// the output with the preset's writer, then renames it.
class MovieExportSession final : public ExportSession,
                                 public std::enable_shared_from_this<MovieExportSession> {
  public:
    MovieExportSession(std::shared_ptr<Asset> asset, QString presetName);

    std::shared_ptr<Asset> asset() const override { return asset_; }
    QString presetName() const override { return preset_; }
    QUrl outputURL() const override;
    void setOutputURL(const QUrl& url) override;
    QString outputFileType() const override;
    void setOutputFileType(const QString& fileType) override;
    MediaTimeRange timeRange() const override;
    void setTimeRange(const MediaTimeRange& range) override;
    std::optional<AudioMix> audioMix() const override;
    void setAudioMix(const std::optional<AudioMix>& mix) override;
    int status() const override { return status_.load(); }
    ErrorPtr error() const override;
    float progress() const override { return progress_.load(); }
    void exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) override;
    void cancelExport() override;

  private:
    void run(std::function<void()> handler);
    ErrorPtr write();
    void finish(ExportSessionStatus status, ErrorPtr error);

    const std::shared_ptr<Asset> asset_;
    const QString preset_;
    mutable std::mutex mutex_; // guards the settings and error_
    QUrl outputURL_;
    QString fileType_;
    std::optional<MediaTimeRange> range_;
    std::optional<AudioMix> audioMix_;
    ErrorPtr error_;
    std::atomic<int> status_{int(ExportSessionStatus::Unknown)};
    std::atomic<float> progress_{0.0f};
    std::atomic<bool> cancelled_{false};
    std::atomic<bool> started_{false};
};

} // namespace platform

#pragma once

#include "FakeWorld.h"
#include "platform/media/ExportSession.h"

#include <atomic>
#include <mutex>

namespace fakes {

// An export session that writes no file. It checks its settings as the real
// session does (an asset without tracks, another file type, no output URL, a
// range that is invalid or empty within the movie: Failed with the real
// session's error codes), then ends as the world's export outcome says. A
// completed export puts a movie of the clipped range's length at the output
// URL in the world. Same threads as the real one: the handler runs once, on a
// worker thread of GlobalQueue, after status() has its final value.
class FakeExportSession final : public platform::ExportSession,
                                public std::enable_shared_from_this<FakeExportSession> {
  public:
    FakeExportSession(std::shared_ptr<platform::Asset> asset, QString presetName,
                      std::shared_ptr<FakeWorld> world);

    std::shared_ptr<platform::Asset> asset() const override { return asset_; }
    QString presetName() const override { return preset_; }
    QUrl outputURL() const override;
    void setOutputURL(const QUrl& url) override;
    QString outputFileType() const override;
    void setOutputFileType(const QString& fileType) override;
    platform::MediaTimeRange timeRange() const override;
    void setTimeRange(const platform::MediaTimeRange& range) override;
    std::optional<platform::AudioMix> audioMix() const override;
    void setAudioMix(const std::optional<platform::AudioMix>& mix) override;
    int status() const override { return status_.load(); }
    platform::ErrorPtr error() const override;
    float progress() const override { return progress_.load(); }
    void exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) override;
    void cancelExport() override { cancelled_ = true; }

  private:
    void run();
    platform::ErrorPtr check(platform::MediaTimeRange* clipped) const;

    const std::shared_ptr<platform::Asset> asset_;
    const QString preset_;
    const std::shared_ptr<FakeWorld> world_;
    mutable std::mutex mutex_; // guards the settings and error_
    QUrl outputURL_;
    QString fileType_;
    std::optional<platform::MediaTimeRange> range_;
    std::optional<platform::AudioMix> audioMix_;
    platform::ErrorPtr error_;
    std::atomic<int> status_{int(platform::ExportSessionStatus::Unknown)};
    std::atomic<float> progress_{0.0f};
    std::atomic<bool> cancelled_{false};
    std::atomic<bool> started_{false};
};

} // namespace fakes

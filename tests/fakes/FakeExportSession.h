#pragma once

#include "FakeWorld.h"
#include "platform/media/ExportSession.h"

#include <atomic>

namespace fakes {

// An export session that writes no file: it ends as the world's export
// outcome says, and a completed export puts a movie of the range's length,
// clipped at the movie's end, at the output URL in the world. An asset the
// world does not hold, or a range empty within the movie, fails as the real
// session fails. Same threads as the real one: configured on one thread, the
// handler runs once, on a worker thread of GlobalQueue, after status() has
// its final value. Every export is recorded in the world.
class FakeExportSession final : public platform::ExportSession,
                                public std::enable_shared_from_this<FakeExportSession> {
  public:
    FakeExportSession(std::shared_ptr<platform::Asset> asset, QString presetName,
                      std::shared_ptr<FakeWorld> world)
        : asset_(std::move(asset)), preset_(std::move(presetName)), world_(std::move(world)) {}

    std::shared_ptr<platform::Asset> asset() const override { return asset_; }
    QString presetName() const override { return preset_; }
    QUrl outputURL() const override { return outputURL_; }
    void setOutputURL(const QUrl& url) override { outputURL_ = url; }
    QString outputFileType() const override { return fileType_; }
    void setOutputFileType(const QString& fileType) override { fileType_ = fileType; }
    platform::MediaTimeRange timeRange() const override;
    void setTimeRange(const platform::MediaTimeRange& range) override { range_ = range; }
    std::optional<platform::AudioMix> audioMix() const override { return audioMix_; }
    void setAudioMix(const std::optional<platform::AudioMix>& mix) override { audioMix_ = mix; }
    int status() const override { return status_.load(); }
    platform::ErrorPtr error() const override { return error_; }
    float progress() const override { return status() == int(Completed) ? 1.0f : 0.0f; }
    void exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) override;
    void cancelExport() override { cancelled_ = true; }

  private:
    static constexpr auto Completed = platform::ExportSessionStatus::Completed;
    void run();

    const std::shared_ptr<platform::Asset> asset_;
    const QString preset_;
    const std::shared_ptr<FakeWorld> world_;
    QUrl outputURL_;
    QString fileType_;
    std::optional<platform::MediaTimeRange> range_;
    std::optional<platform::AudioMix> audioMix_;
    platform::ErrorPtr error_; // written before the final status
    std::atomic<int> status_{int(platform::ExportSessionStatus::Unknown)};
    std::atomic<bool> cancelled_{false};
    std::atomic<bool> started_{false};
};

} // namespace fakes

#pragma once

#include "platform/media/ExportSession.h"

#include <QList>
#include <memory>

// An export session that records how it was set up and finishes when the
// test says so (on the test's thread).
class ControlledExportSession : public platform::ExportSession {
  public:
    ControlledExportSession(std::shared_ptr<platform::Asset> asset, QString presetName)
        : asset_(std::move(asset)), preset_(std::move(presetName)) {}

    std::shared_ptr<platform::Asset> asset() const override { return asset_; }
    QString presetName() const override { return preset_; }
    QUrl outputURL() const override { return output_; }
    void setOutputURL(const QUrl& url) override { output_ = url; }
    QString outputFileType() const override { return fileType_; }
    void setOutputFileType(const QString& fileType) override { fileType_ = fileType; }
    platform::MediaTimeRange timeRange() const override { return range_; }
    void setTimeRange(const platform::MediaTimeRange& range) override { range_ = range; }
    std::optional<platform::AudioMix> audioMix() const override { return mix_; }
    void setAudioMix(const std::optional<platform::AudioMix>& mix) override { mix_ = mix; }
    int status() const override { return status_; }
    platform::ErrorPtr error() const override { return nullptr; }
    float progress() const override { return 0; }
    void exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) override {
        handler_ = std::move(handler);
        status_ = int(platform::ExportSessionStatus::Exporting);
        ++starts;
    }
    void cancelExport() override { ++cancels; }

    // Ends the export with `status` and runs the handler.
    void finish(platform::ExportSessionStatus status) {
        status_ = int(status);
        if (auto handler = std::exchange(handler_, {}))
            handler();
    }

    int starts = 0;
    int cancels = 0;

  private:
    std::shared_ptr<platform::Asset> asset_;
    QString preset_;
    QUrl output_;
    QString fileType_;
    platform::MediaTimeRange range_;
    std::optional<platform::AudioMix> mix_;
    int status_ = int(platform::ExportSessionStatus::Unknown);
    std::function<void()> handler_;
};

// Puts ControlledExportSession in the real session's place for its lifetime and
// keeps every session made.
class ControlledExportSessions {
  public:
    ControlledExportSessions()
        : replacement_(platform::ExportSession::implementation().replace(
              [this](std::shared_ptr<platform::Asset> asset, const QString& preset) {
                  auto session =
                      std::make_shared<ControlledExportSession>(std::move(asset), preset);
                  made.append(session);
                  return std::static_pointer_cast<platform::ExportSession>(session);
              })) {}

    QList<std::shared_ptr<ControlledExportSession>> made;

  private:
    platform::Implementation<platform::ExportSession::Maker>::Replacement replacement_;
};

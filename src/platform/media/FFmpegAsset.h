#pragma once

#include "platform/media/Asset.h"

namespace platform {

// The asset on FFmpeg: libavformat reads the headers once, when it is made.
// The file stays open (one descriptor) for as long as the asset lives, and
// its readers read through it.
class FFmpegAsset final : public Asset {
  public:
    // Never null; see Asset::assetWithURL.
    static std::shared_ptr<FFmpegAsset> open(const QUrl& url);
    ~FFmpegAsset() override;
    FFmpegAsset(const FFmpegAsset&) = delete;
    FFmpegAsset& operator=(const FFmpegAsset&) = delete;

    const QUrl& url() const override;
    const QString& hostPath() const override;
    const QString& readablePath() const override;
    QList<AssetTrack> tracks() const override;
    MediaTime duration() const override;
    bool isPlayable() const override;
    ErrorPtr error() const override;

  private:
    FFmpegAsset() = default;

    QUrl url_;
    QString hostPath_;
    QString readablePath_;
    int descriptor_ = -1;
    QList<AssetTrack> tracks_;
    MediaTime duration_;
    bool playable_ = false;
    ErrorPtr error_;
};

} // namespace platform

#pragma once

#include "platform/media/Asset.h"

namespace platform {

// The asset on FFmpeg: libavformat reads the headers once, when it is made,
// and closes the file again.
class FFmpegAsset final : public Asset {
  public:
    // Never null; see Asset::assetWithURL.
    static std::shared_ptr<FFmpegAsset> open(const QUrl& url);

    const QUrl& url() const override;
    const QString& hostPath() const override;
    QList<AssetTrack> tracks() const override;
    MediaTime duration() const override;
    bool isPlayable() const override;
    ErrorPtr error() const override;

  private:
    FFmpegAsset() = default;

    QUrl url_;
    QString hostPath_;
    QList<AssetTrack> tracks_;
    MediaTime duration_;
    bool playable_ = false;
    ErrorPtr error_;
};

} // namespace platform

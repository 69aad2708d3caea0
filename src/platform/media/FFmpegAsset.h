#pragma once

#include "platform/media/Asset.h"

#include <chrono>

namespace platform {

// The asset on FFmpeg: libavformat reads the headers once, when it is made.
// The file stays open (one descriptor) for as long as the asset lives, and
// its readers read through it.
class FFmpegAsset final : public Asset {
  public:
    // How long open() waits for the headers of a file that does not answer.
    static constexpr std::chrono::milliseconds kHeaderBound{5000};

    // Never null; see Asset::assetWithURL. A path that is not a regular file
    // is refused before anything reads it; headers that take longer than
    // kHeaderBound give an asset without tracks whose error says so (the
    // reading goes on alone and its result is dropped).
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
    static std::shared_ptr<FFmpegAsset> readHeaders(const QUrl& url);

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

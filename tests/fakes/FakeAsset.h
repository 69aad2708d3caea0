#pragma once

#include "FakeWorld.h"
#include "platform/media/Asset.h"

#include <optional>

namespace fakes {

// An asset whose headers come from the fake world instead of a file: the
// movie's video track (unless it has none) and an audio track, or, where the
// world has no movie, no tracks and the error a missing file gives.
class FakeAsset final : public platform::Asset {
  public:
    FakeAsset(const QUrl& url, const std::optional<FakeMovie>& movie);

    const QUrl& url() const override { return url_; }
    const QString& hostPath() const override { return hostPath_; }
    QList<platform::AssetTrack> tracks() const override { return tracks_; }
    platform::MediaTime duration() const override { return duration_; }
    bool isPlayable() const override { return !tracks_.isEmpty(); }
    platform::ErrorPtr error() const override { return error_; }

  private:
    QUrl url_;
    QString hostPath_;
    QList<platform::AssetTrack> tracks_;
    platform::MediaTime duration_ = platform::MediaTime::invalid();
    platform::ErrorPtr error_;
};

} // namespace fakes

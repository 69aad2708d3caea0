#pragma once

#include "platform/media/Asset.h"
#include "platform/media/MediaTime.h"
#include "platform/media/playback/KeyValueObserver.h"
#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QList>
#include <QUrl>

#include <cstdint>
#include <functional>
#include <memory>

namespace platform {

// One movie as a player plays it: its asset, its loading status, what is
// loaded, and (through the player it is in) its current time.
//
// Threads: main thread only. Ownership: shared; a player holds its current
// item strongly, the item refers back to that player weakly. An item is in at
// most one player at a time.
//
// Status: Unknown until a player has opened the file; ReadyToPlay once the
// player has opened it and found a video or audio track (a still image alone
// is not a movie); Failed, with error(), when the URL is not a local file, the
// file cannot be opened, or it holds nothing to play. A status never goes back
// to Unknown. Observers hear of every change on the main queue, after the
// change (never from inside the call that caused it).
//
// The status and its observers live here, so every implementation reports
// them the same way; an implementation changes the status with setStatus().
class PlayerItem : public std::enable_shared_from_this<PlayerItem> {
  public:
    enum class Status { Unknown = 0, ReadyToPlay = 1, Failed = 2 };

    virtual ~PlayerItem() = default;
    PlayerItem(const PlayerItem&) = delete;
    PlayerItem& operator=(const PlayerItem&) = delete;

    // Opens the asset on `url` (device paths are mapped) synchronously.
    static std::shared_ptr<PlayerItem> playerItemWithURL(const QUrl& url);
    // An item from implementation(): the real one, played by libmpv, unless a
    // test replaced it. A null `asset` stands for an asset on no URL.
    static std::shared_ptr<PlayerItem> playerItemWithAsset(std::shared_ptr<Asset> asset);
    using Maker = std::shared_ptr<PlayerItem>(std::shared_ptr<Asset>);
    static Implementation<Maker>& implementation();

    const std::shared_ptr<Asset>& asset() const { return asset_; }
    const QUrl& url() const { return asset_->url(); }

    Status status() const { return status_; }
    // Why the status is Failed; null otherwise.
    ErrorPtr error() const { return error_; }

    // The timescale of the item's times: the first video track's, else the
    // first track's, else 600 (a scale at which common frame rates are whole).
    std::int32_t timescale() const;
    // Invalid until ReadyToPlay; then the asset's duration, or the player's
    // when the headers gave none.
    virtual MediaTime duration() const = 0;
    // The playback position at timescale(). The all-zero invalid time when
    // the item is in no player; zero before the player has reported a time.
    virtual MediaTime currentTime() const = 0;
    // The spans of the file that are buffered or can be read at once, at
    // timescale(); a local file that is ready is readable whole.
    virtual QList<MediaTimeRange> loadedTimeRanges() const = 0;

    // "status" observation with a callback. Returns a token for removal.
    using StatusObserver = std::function<void(PlayerItem& item)>;
    int addStatusObserver(StatusObserver observer);
    void removeStatusObserver(int token);

    // "status" observation through an observer object. Only the key path
    // "status" is observable; others are refused with a log line. The
    // observer is not owned: it must be removed before it is destroyed.
    void addObserver_forKeyPath_options_context(KeyValueObserver* observer, const QString& keyPath,
                                                int options, void* context);
    void removeObserver_forKeyPath(KeyValueObserver* observer, const QString& keyPath);

  protected:
    // `asset` must not be null.
    explicit PlayerItem(std::shared_ptr<Asset> asset);

    // Main thread. Changes the status (Unknown and the status it already has
    // are ignored) and tells every observer, each on a turn of the main queue
    // of its own. `error` is kept only with Failed.
    void setStatus(Status status, ErrorPtr error = nullptr);

  private:
    struct Observer {
        int token;
        StatusObserver callback;
        KeyValueObserver* object = nullptr;
        int options = 0;
        void* context = nullptr;
    };
    void deliver(const Observer& observer, Status oldStatus, Status newStatus);

    std::shared_ptr<Asset> asset_;
    Status status_ = Status::Unknown;
    ErrorPtr error_;
    QList<Observer> observers_;
    int nextToken_ = 1;
};

} // namespace platform

#include "PlayerItem.h"

#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

namespace platform {

namespace {

const QString kStatusKeyPath = QStringLiteral("status");
constexpr std::int32_t kFallbackTimescale = 600;

} // namespace

PlayerItem::PlayerItem(std::shared_ptr<Asset> asset) : asset_(std::move(asset)) {}

std::shared_ptr<PlayerItem> PlayerItem::playerItemWithURL(const QUrl& url) {
    return playerItemWithAsset(Asset::assetWithURL(url));
}

std::shared_ptr<PlayerItem> PlayerItem::playerItemWithAsset(std::shared_ptr<Asset> asset) {
    if (!asset)
        asset = Asset::assetWithURL(QUrl());
    return implementation().make(std::move(asset));
}

std::int32_t PlayerItem::timescale() const {
    const QList<AssetTrack> video = asset_->tracksWithMediaType(MediaType::Video);
    if (!video.isEmpty() && video.first().naturalTimeScale > 0)
        return video.first().naturalTimeScale;
    const QList<AssetTrack> all = asset_->tracks();
    if (!all.isEmpty() && all.first().naturalTimeScale > 0)
        return all.first().naturalTimeScale;
    return kFallbackTimescale;
}

int PlayerItem::addStatusObserver(StatusObserver observer) {
    const int token = nextToken_++;
    observers_.append({token, std::move(observer)});
    return token;
}

void PlayerItem::removeStatusObserver(int token) {
    observers_.removeIf([token](const Observer& o) { return o.token == token; });
}

void PlayerItem::addObserver_forKeyPath_options_context(KeyValueObserver* observer,
                                                        const QString& keyPath, int options,
                                                        void* context) {
    if (!observer)
        return;
    if (keyPath != kStatusKeyPath) {
        logError(QStringLiteral("player item: cannot observe \"%1\"").arg(keyPath));
        return;
    }
    Observer entry{nextToken_++, {}, observer, options, context};
    observers_.append(entry);
    if (options & KeyValueObserver::Initial)
        deliver(entry, status_, status_);
}

void PlayerItem::removeObserver_forKeyPath(KeyValueObserver* observer, const QString& keyPath) {
    if (keyPath != kStatusKeyPath)
        return;
    observers_.removeIf([observer](const Observer& o) { return o.object == observer; });
}

void PlayerItem::setStatus(Status status, ErrorPtr error) {
    if (status == status_ || status == Status::Unknown)
        return;
    const Status old = status_;
    status_ = status;
    error_ = status == Status::Failed ? std::move(error) : nullptr;
    for (const Observer& observer : observers_)
        deliver(observer, old, status);
}

void PlayerItem::deliver(const Observer& observer, Status oldStatus, Status newStatus) {
    // Queued, so an observer may replace the player or drop this item
    // without pulling the ground from under the code that changed the status.
    MainQueue::async([weak = weak_from_this(), token = observer.token, oldStatus, newStatus] {
        const std::shared_ptr<PlayerItem> self = weak.lock();
        if (!self)
            return;
        for (const Observer& registered : self->observers_) {
            if (registered.token != token)
                continue;
            // A copy: the observer may remove itself while it runs.
            const Observer o = registered;
            if (o.callback) {
                o.callback(*self);
            } else if (o.object) {
                QVariantMap change{{QStringLiteral("kind"), 1}};
                if (o.options & KeyValueObserver::New)
                    change.insert(QStringLiteral("new"), int(newStatus));
                if (o.options & KeyValueObserver::Old)
                    change.insert(QStringLiteral("old"), int(oldStatus));
                o.object->observeValueForKeyPath_ofObject_change_context(kStatusKeyPath, self.get(),
                                                                         change, o.context);
            }
            return;
        }
    });
}

} // namespace platform

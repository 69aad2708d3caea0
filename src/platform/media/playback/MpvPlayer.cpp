#include "MpvPlayer.h"

#include "MpvCore.h"
#include "MpvPlayer_Internal.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <algorithm>
#include <cerrno>
#include <cmath>

namespace platform {

namespace {

// The libmpv video filter that turns the first video track's frames as its
// display matrix says (empty: none), in quarter turns clockwise.
QByteArray uprightFilter(const Asset& asset) {
    const QList<AssetTrack> video = asset.tracksWithMediaType(MediaType::Video);
    if (video.isEmpty())
        return {};
    const QTransform& t = video.first().preferredTransform;
    const double degrees = std::atan2(t.m12(), t.m11()) * 180.0 / M_PI;
    switch ((int(std::lround(degrees / 90.0)) % 4 + 4) % 4) {
    case 1:
        return QByteArrayLiteral("lavfi=[transpose=clock]");
    case 2:
        return QByteArrayLiteral("lavfi=[hflip,vflip]");
    case 3:
        return QByteArrayLiteral("lavfi=[transpose=cclock]");
    default:
        return {};
    }
}

} // namespace

Implementation<Player::Maker>& Player::implementation() {
    static Implementation<Maker> chosen([](std::shared_ptr<PlayerItem> item) {
        return std::shared_ptr<Player>(MpvPlayer::make(std::move(item)));
    });
    return chosen;
}

std::shared_ptr<Player> Player::playerWithPlayerItem(std::shared_ptr<PlayerItem> item) {
    return implementation().make(std::move(item));
}

std::shared_ptr<Player> Player::playerWithURL(const QUrl& url) {
    return playerWithPlayerItem(PlayerItem::playerItemWithURL(url));
}

MpvPlayer::MpvPlayer() = default;

MpvPlayer::~MpvPlayer() {
    if (item_)
        item_->player_.reset();
    finishSeeks(false);
    // Blocks already queued for observers of a player that is gone stay quiet.
    for (const auto& observer : periodic_)
        *observer->alive = false;
    for (const BoundaryObserver& observer : boundaries_)
        *observer.alive = false;
    periodic_.clear();
    // The core (and with it the render context, first) goes last.
    core_.reset();
}

std::shared_ptr<MpvPlayer> MpvPlayer::make(std::shared_ptr<PlayerItem> item) {
    std::shared_ptr<MpvPlayer> player(new MpvPlayer);
    player->start();
    player->replaceCurrentItemWithPlayerItem(std::move(item));
    return player;
}

void MpvPlayer::start() {
    core_ = MpvCore::create(&startError_);
    if (!core_) {
        logError(
            QStringLiteral("player: %1").arg(startError_ ? startError_->message() : QString()));
        return;
    }
    for (const PropertyId& property : observedProperties())
        mpv_observe_property(core_->handle(), property.id, property.name, property.format);
    std::weak_ptr<MpvPlayer> weak = weak_from_this();
    core_->setEventHandler([weak](const mpv_event& event) {
        if (auto self = weak.lock())
            self->handleEvent(event);
    });
}

void MpvPlayer::replaceCurrentItemWithPlayerItem(std::shared_ptr<PlayerItem> anyItem) {
    std::shared_ptr<MpvPlayerItem> item = std::dynamic_pointer_cast<MpvPlayerItem>(anyItem);
    if (anyItem && !item) {
        logError(QStringLiteral("player: an item of another kind cannot be played here"));
        return;
    }
    if (item && item == item_)
        return;
    if (item) {
        const std::shared_ptr<MpvPlayer> owner = item->player_.lock();
        if (owner && owner.get() != this && owner->currentItem() == item) {
            logError(QStringLiteral("player: an item cannot be in two players"));
            return;
        }
    }
    if (item_)
        item_->player_.reset();
    finishSeeks(false);
    item_ = std::move(item);
    ++generation_;
    loaded_ = false;
    endReached_ = false;
    position_.reset();
    crossingFrom_ = 0;
    expectedEntry_ = -1;
    updateClock();

    if (!item_) {
        if (core_)
            core_->command({"stop"});
        return;
    }
    item_->player_ = weak_from_this();
    if (core_)
        core_->command({"stop"});
    // Loading starts on the next turn of the main loop, so a widget pointed
    // at a new player right after it was made gets the first frame already.
    MainQueue::async([weak = weak_from_this(), generation = generation_] {
        if (auto self = weak.lock())
            self->load(generation);
    });
}

void MpvPlayer::load(std::uint64_t generation) {
    if (generation != generation_ || !item_)
        return;
    if (!core_) {
        failItem(startError_);
        return;
    }
    const std::shared_ptr<Asset>& asset = item_->asset();
    const QString hostPath = DevicePaths::hostPathOfUrl(asset->url());
    if (hostPath.isEmpty()) {
        // An item on no URL at all is what an editor holds before its movie
        // is known: it fails as any other, but is nothing worth a log line.
        failItem(makeError(-EPROTONOSUPPORT, mediaErrorDomain(),
                           QStringLiteral("not a local file: %1").arg(asset->url().toString())),
                 /*quietly=*/asset->url().isEmpty());
        return;
    }
    if (asset->tracks().isEmpty()) {
        // FFmpeg found nothing to play; libmpv, which reads through it, would
        // not either.
        failItem(asset->error()
                     ? asset->error()
                     : makeError(-EINVAL, mediaErrorDomain(),
                                 QStringLiteral("not a movie: %1").arg(asset->url().toString())));
        return;
    }
    // Set before the load, so the first frame already comes out upright.
    core_->setProperty("vf", uprightFilter(*asset));
    core_->command({"loadfile", hostPath.toUtf8(), "replace"}, kLoadReplyBase + generation_);
}

void MpvPlayer::failItem(ErrorPtr error, bool quietly) {
    if (!error)
        error = makeError(-EINVAL, mediaErrorDomain(), QStringLiteral("the item cannot be played"));
    if (!quietly)
        logError(QStringLiteral("player: item failed: %1").arg(error->message()));
    if (core_ && loaded_)
        core_->command({"stop"});
    loaded_ = false;
    finishSeeks(false);
    updateClock();
    if (item_)
        item_->setStatus(PlayerItem::Status::Failed, std::move(error));
}

void MpvPlayer::setRate(float rate) {
    if (!(rate >= 0.0f)) {
        logError(QStringLiteral("player: rate %1 is not supported").arg(double(rate)));
        return;
    }
    const bool changed = rate != rate_;
    rate_ = rate;
    if (core_) {
        if (rate > 0) {
            core_->setProperty("speed", QByteArray::number(double(rate), 'g', 6));
            core_->setProperty("pause", "no");
        } else {
            core_->setProperty("pause", "yes");
        }
    }
    if (rate > 0)
        crossingFrom_ = position_.value_or(0);
    updateClock();
    if (changed)
        firePeriodicObservers();
    if (rate > 0 && endReached_ && loaded_ && !seek_.pending) {
        // Standing at the end, playing reaches the end again at once; libmpv
        // reports nothing new there, so the end is played out here.
        MainQueue::async([weak = weak_from_this(), generation = generation_] {
            auto self = weak.lock();
            if (self && self->generation_ == generation && self->rate_ > 0 && self->endReached_ &&
                !self->seek_.pending)
                self->handleEndOfItem();
        });
    }
}

MediaTime MpvPlayer::currentTime() const {
    if (!item_)
        return MediaTime::invalid();
    const std::int32_t timescale = item_->timescale();
    if (seek_.pending)
        return seek_.target.convertScale(timescale);
    double seconds = position_.value_or(0.0);
    // At the end libmpv may count on to where the audio runs out; the item
    // ends at its duration.
    const MediaTime duration = item_->duration();
    if (duration.isNumeric())
        seconds = std::min(seconds, duration.seconds());
    return MediaTime::fromSeconds(seconds, timescale);
}

void MpvPlayer::seekToTime(const MediaTime& time) {
    // libmpv's plain absolute seek decodes up to the frame at the time.
    seek(time, "absolute", {});
}

void MpvPlayer::seekToTime_toleranceBefore_toleranceAfter_completionHandler(
    const MediaTime& time, const MediaTime& toleranceBefore, const MediaTime& toleranceAfter,
    SeekCompletion completion) {
    const bool exact = toleranceBefore == MediaTime::zero() && toleranceAfter == MediaTime::zero();
    const bool anyKeyframe = toleranceBefore == MediaTime::positiveInfinity() &&
                             toleranceAfter == MediaTime::positiveInfinity();
    seek(time,
         exact         ? "absolute+exact"
         : anyKeyframe ? "absolute+keyframes"
                       : "absolute",
         std::move(completion));
}

void MpvPlayer::seek(const MediaTime& time, const QByteArray& mode, SeekCompletion completion) {
    if (!time.isNumeric() || !item_ || item_->status() == PlayerItem::Status::Failed) {
        if (completion)
            MainQueue::async([completion] { completion(false); });
        return;
    }
    finishSeeks(false);
    seek_.pending = true;
    seek_.target = time < MediaTime::zero() ? MediaTime::zero() : time;
    seek_.mode = mode;
    seek_.issued = false;
    seek_.started = false;
    seek_.landing.reset();
    if (completion)
        seek_.completions.push_back(std::move(completion));
    endReached_ = false;
    if (loaded_)
        issueSeek();
}

void MpvPlayer::issueSeek() {
    if (!core_)
        return;
    seek_.issued = true;
    seek_.started = false;
    ++seek_.repliesOutstanding;
    core_->command({"seek", QByteArray::number(seek_.target.seconds(), 'f', 9), seek_.mode},
                   kSeekReply);
}

void MpvPlayer::finishSeeks(bool finished) {
    if (!finished) {
        seek_.pending = false;
        seek_.issued = false;
    }
    std::vector<SeekCompletion> completions;
    completions.swap(seek_.completions);
    for (SeekCompletion& completion : completions)
        MainQueue::async([completion = std::move(completion), finished] { completion(finished); });
}

} // namespace platform

#include "FakePlayer.h"

#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <algorithm>
#include <cerrno>

using namespace platform;

namespace fakes {

std::shared_ptr<FakePlayer> FakePlayer::make(std::shared_ptr<PlayerItem> item) {
    std::shared_ptr<FakePlayer> player(new FakePlayer);
    player->replaceCurrentItemWithPlayerItem(std::move(item));
    return player;
}

FakePlayer::~FakePlayer() {
    if (item_)
        item_->player_.reset();
    finishSeeks(false);
    for (const Periodic& observer : periodic_)
        *observer.alive = false;
    for (const Boundary& observer : boundaries_)
        *observer.alive = false;
}

void FakePlayer::replaceCurrentItemWithPlayerItem(std::shared_ptr<PlayerItem> anyItem) {
    auto item = std::dynamic_pointer_cast<FakePlayerItem>(anyItem);
    if (anyItem && !item) {
        logError(QStringLiteral("player: an item of another kind cannot be played here"));
        return;
    }
    if (item && item == item_)
        return;
    if (item) {
        const std::shared_ptr<FakePlayer> owner = item->player_.lock();
        if (owner && owner.get() != this && owner->item_ == item) {
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
    position_ = 0;
    if (!item_)
        return;
    item_->player_ = weak_from_this();
    MainQueue::async([weak = weak_from_this(), generation = generation_] {
        if (auto self = weak.lock())
            self->load(generation);
    });
}

void FakePlayer::load(std::uint64_t generation) {
    if (generation != generation_ || !item_)
        return;
    const std::shared_ptr<Asset>& asset = item_->asset();
    if (asset->tracks().isEmpty()) {
        ErrorPtr error =
            asset->error()
                ? asset->error()
                : makeError(-EINVAL, mediaErrorDomain(),
                            QStringLiteral("not a movie: %1").arg(asset->url().toString()));
        logError(QStringLiteral("player: item failed: %1").arg(error->message()));
        finishSeeks(false);
        item_->fail(std::move(error));
        return;
    }
    loaded_ = true;
    if (seekTarget_)
        issueSeek();
    item_->becomeReady();
}

void FakePlayer::setRate(float rate) {
    if (!(rate >= 0.0f)) {
        logError(QStringLiteral("player: rate %1 is not supported").arg(double(rate)));
        return;
    }
    const bool changed = rate != rate_;
    rate_ = rate;
    if (changed)
        firePeriodicObservers();
}

MediaTime FakePlayer::currentTime() const {
    if (!item_)
        return MediaTime::invalid();
    const std::int32_t timescale = item_->timescale();
    if (seekTarget_)
        return seekTarget_->convertScale(timescale);
    double seconds = position_;
    const MediaTime duration = item_->duration();
    if (duration.isNumeric())
        seconds = std::min(seconds, duration.seconds());
    return MediaTime::fromSeconds(seconds, timescale);
}

void FakePlayer::seekToTime(const MediaTime& time) {
    seekToTime_toleranceBefore_toleranceAfter_completionHandler(time, MediaTime::invalid(),
                                                                MediaTime::invalid(), {});
}

void FakePlayer::seekToTime_toleranceBefore_toleranceAfter_completionHandler(
    const MediaTime& time, const MediaTime&, const MediaTime&, SeekCompletion completion) {
    seeks_.append(time);
    if (!time.isNumeric() || !item_ || item_->status() == PlayerItem::Status::Failed) {
        if (completion)
            MainQueue::async([completion] { completion(false); });
        return;
    }
    finishSeeks(false);
    seekTarget_ = time < MediaTime::zero() ? MediaTime::zero() : time;
    ++seekId_;
    if (completion)
        seekCompletions_.push_back(std::move(completion));
    if (loaded_)
        issueSeek();
}

void FakePlayer::issueSeek() {
    // Lands on a later turn, as a real seek does; a newer seek supersedes it.
    MainQueue::async([weak = weak_from_this(), id = seekId_] {
        auto self = weak.lock();
        if (!self || self->seekId_ != id || !self->seekTarget_)
            return;
        self->position_ = std::max(0.0, self->seekTarget_->seconds());
        const MediaTime duration = self->item_ ? self->item_->duration() : MediaTime::invalid();
        if (duration.isNumeric())
            self->position_ = std::min(self->position_, duration.seconds());
        self->seekTarget_.reset();
        self->finishSeeks(true);
        self->firePeriodicObservers();
    });
}

void FakePlayer::finishSeeks(bool finished) {
    if (!finished)
        seekTarget_.reset();
    std::vector<SeekCompletion> completions;
    completions.swap(seekCompletions_);
    for (SeekCompletion& completion : completions)
        MainQueue::async([completion = std::move(completion), finished] { completion(finished); });
}

TimeObserverToken FakePlayer::addPeriodicTimeObserverForInterval_queue_usingBlock(
    const MediaTime& interval, ObserverQueue queue, std::function<void(MediaTime)> block) {
    if (!block || !interval.isNumeric() || !(interval.seconds() > 0)) {
        logError(QStringLiteral("player: periodic observer refused, interval %1")
                     .arg(interval.description()));
        return {};
    }
    periodic_.push_back({nextObserverId_++, std::make_shared<std::atomic_bool>(true),
                         std::move(queue), std::move(block)});
    return {periodic_.back().id};
}

TimeObserverToken FakePlayer::addBoundaryTimeObserverForTimes_queue_usingBlock(
    const QList<MediaTime>& times, ObserverQueue queue, std::function<void()> block) {
    Boundary observer{nextObserverId_++,
                      std::make_shared<std::atomic_bool>(true),
                      {},
                      std::move(queue),
                      std::move(block)};
    for (const MediaTime& time : times)
        if (time.isNumeric())
            observer.seconds.append(time.seconds());
    if (!observer.block || observer.seconds.isEmpty()) {
        logError(QStringLiteral("player: boundary observer refused, no valid time"));
        return {};
    }
    boundaries_.push_back(std::move(observer));
    return {boundaries_.back().id};
}

void FakePlayer::removeTimeObserver(TimeObserverToken token) {
    if (!token)
        return;
    std::erase_if(periodic_, [&](const Periodic& o) {
        if (o.id != token.id)
            return false;
        *o.alive = false;
        return true;
    });
    std::erase_if(boundaries_, [&](const Boundary& o) {
        if (o.id != token.id)
            return false;
        *o.alive = false;
        return true;
    });
}

void FakePlayer::advance(double seconds) {
    if (!(rate_ > 0) || !loaded_ || seekTarget_ || !item_ ||
        item_->status() != PlayerItem::Status::ReadyToPlay)
        return;
    const double end = item_->duration().seconds();
    const double from = position_;
    position_ = std::min(position_ + seconds * double(rate_), end);
    if (position_ >= end) {
        endOfItem(from);
        return;
    }
    fireBoundaries(from, position_, false);
    firePeriodicObservers();
}

void FakePlayer::endOfItem(double from) {
    fireBoundaries(from, position_, true);
    const std::shared_ptr<PlayerItem> item = item_;
    switch (actionAtItemEnd_) {
    case ActionAtItemEnd::Pause:
        pause();
        break;
    case ActionAtItemEnd::Advance:
        pause();
        replaceCurrentItemWithPlayerItem(nullptr);
        break;
    case ActionAtItemEnd::None:
        break;
    }
    MainQueue::async([item] {
        NotificationCenter::defaultCenter().post(itemDidPlayToEndNotification(), item.get());
    });
}

void FakePlayer::firePeriodicObservers() {
    if (!item_)
        return;
    const MediaTime time = currentTime();
    for (const Periodic& observer : periodic_)
        run(observer.queue, observer.alive, [block = observer.block, time] { block(time); });
}

void FakePlayer::fireBoundaries(double from, double to, bool inclusiveEnd) {
    for (const Boundary& observer : boundaries_) {
        const bool crossed =
            std::any_of(observer.seconds.begin(), observer.seconds.end(),
                        [&](double t) { return t > from && (t <= to || inclusiveEnd); });
        if (crossed)
            run(observer.queue, observer.alive, observer.block);
    }
}

void FakePlayer::run(const ObserverQueue& queue, const Liveness& alive, std::function<void()> job) {
    auto guarded = [alive, job = std::move(job)] {
        if (*alive)
            job();
    };
    if (queue)
        queue(std::move(guarded));
    else
        MainQueue::async(std::move(guarded));
}

} // namespace fakes

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
    endSeek(false);
    for (const Observer& observer : observers_)
        *observer.alive = false;
}

void FakePlayer::replaceCurrentItemWithPlayerItem(std::shared_ptr<PlayerItem> anyItem) {
    auto item = std::dynamic_pointer_cast<FakePlayerItem>(anyItem); // only fakes play here
    if (item == item_)
        return;
    if (item_)
        item_->player_.reset();
    endSeek(false);
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
            asset->error() ? asset->error()
                           : makeError(-EINVAL, mediaErrorDomain(), QStringLiteral("not a movie"));
        logError(QStringLiteral("player: item failed: %1").arg(error->message()));
        endSeek(false);
        item_->fail(std::move(error));
        return;
    }
    loaded_ = true;
    if (seekTarget_)
        land(seekId_);
    item_->becomeReady();
}

void FakePlayer::setRate(float rate) {
    if (std::exchange(rate_, rate) != rate)
        firePeriodicObservers();
}

MediaTime FakePlayer::currentTime() const {
    if (!item_)
        return MediaTime::invalid();
    if (seekTarget_)
        return seekTarget_->convertScale(item_->timescale());
    return MediaTime::fromSeconds(position_, item_->timescale());
}

void FakePlayer::seekToTime_toleranceBefore_toleranceAfter_completionHandler(
    const MediaTime& time, const MediaTime&, const MediaTime&, SeekCompletion completion) {
    seeks_.append(time);
    if (!time.isNumeric() || !item_ || item_->status() == PlayerItem::Status::Failed) {
        if (completion)
            MainQueue::async([completion] { completion(false); });
        return;
    }
    endSeek(false);
    seekTarget_ = std::max(time, MediaTime::zero());
    seekCompletion_ = std::move(completion);
    ++seekId_;
    if (loaded_)
        land(seekId_);
}

void FakePlayer::land(std::uint64_t seek) {
    // On a later turn, as a real seek lands; a newer seek supersedes it.
    MainQueue::async([weak = weak_from_this(), seek] {
        auto self = weak.lock();
        if (!self || self->seekId_ != seek || !self->seekTarget_)
            return;
        self->position_ =
            std::clamp(self->seekTarget_->seconds(), 0.0, self->item_->duration().seconds());
        self->seekTarget_.reset();
        self->endSeek(true);
        self->firePeriodicObservers();
    });
}

void FakePlayer::endSeek(bool finished) {
    if (!finished)
        seekTarget_.reset();
    if (SeekCompletion completion = std::exchange(seekCompletion_, {}))
        MainQueue::async([completion, finished] { completion(finished); });
}

TimeObserverToken FakePlayer::addPeriodicTimeObserverForInterval_queue_usingBlock(
    const MediaTime& interval, ObserverQueue queue, std::function<void(MediaTime)> block) {
    if (!block || !interval.isNumeric() || !(interval.seconds() > 0))
        return {};
    return addObserver({}, std::move(queue), std::move(block));
}

TimeObserverToken FakePlayer::addBoundaryTimeObserverForTimes_queue_usingBlock(
    const QList<MediaTime>& times, ObserverQueue queue, std::function<void()> block) {
    QList<double> seconds;
    for (const MediaTime& time : times)
        if (time.isNumeric())
            seconds.append(time.seconds());
    if (!block || seconds.isEmpty())
        return {};
    return addObserver(seconds, std::move(queue), [block](MediaTime) { block(); });
}

TimeObserverToken FakePlayer::addObserver(QList<double> boundaries, ObserverQueue queue,
                                          std::function<void(MediaTime)> block) {
    observers_.push_back({nextObserverId_++, std::make_shared<std::atomic_bool>(true),
                          std::move(queue), std::move(block), std::move(boundaries)});
    return {observers_.back().id};
}

void FakePlayer::removeTimeObserver(TimeObserverToken token) {
    std::erase_if(observers_, [&](const Observer& observer) {
        if (observer.id == token.id)
            *observer.alive = false;
        return !*observer.alive;
    });
}

void FakePlayer::advance(double seconds) {
    if (!(rate_ > 0) || !loaded_ || seekTarget_ || !item_)
        return;
    const double end = item_->duration().seconds();
    const double from = position_;
    position_ = std::min(position_ + seconds * double(rate_), end);
    fireBoundaries(from, position_, position_ >= end);
    if (position_ < end) {
        firePeriodicObservers();
        return;
    }
    const std::shared_ptr<PlayerItem> item = item_;
    if (actionAtItemEnd_ != ActionAtItemEnd::None)
        pause();
    if (actionAtItemEnd_ == ActionAtItemEnd::Advance)
        replaceCurrentItemWithPlayerItem(nullptr);
    MainQueue::async([item] {
        NotificationCenter::defaultCenter().post(itemDidPlayToEndNotification(), item.get());
    });
}

void FakePlayer::notify(const Observer& observer) {
    auto job = [alive = observer.alive, block = observer.block, time = currentTime()] {
        if (*alive)
            block(time);
    };
    if (observer.queue)
        observer.queue(std::move(job));
    else
        MainQueue::async(std::move(job));
}

void FakePlayer::firePeriodicObservers() {
    for (const Observer& observer : observers_)
        if (item_ && observer.boundaries.isEmpty())
            notify(observer);
}

void FakePlayer::fireBoundaries(double from, double to, bool atEnd) {
    for (const Observer& observer : observers_)
        if (std::any_of(observer.boundaries.begin(), observer.boundaries.end(),
                        [&](double t) { return t > from && (t <= to || atEnd); }))
            notify(observer);
}

} // namespace fakes

// Periodic and boundary time observers.

#include "MpvPlayer_Internal.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <algorithm>
#include <cmath>

namespace platform {

TimeObserverToken MpvPlayer::addPeriodicTimeObserverForInterval_queue_usingBlock(
    const MediaTime& interval, ObserverQueue queue, std::function<void(MediaTime)> block) {
    const double seconds = interval.seconds();
    if (!block || !interval.isNumeric() || !(seconds > 0)) {
        logError(QStringLiteral("player: periodic observer refused, interval %1")
                     .arg(interval.description()));
        return {};
    }
    auto observer = std::make_unique<PeriodicObserver>();
    observer->id = nextObserverId_++;
    observer->alive = std::make_shared<std::atomic_bool>(true);
    observer->intervalSeconds = seconds;
    observer->queue = std::move(queue);
    observer->block = std::move(block);
    observer->timer = std::make_unique<QTimer>();
    observer->timer->setTimerType(Qt::PreciseTimer);
    QObject::connect(
        observer->timer.get(), &QTimer::timeout, [weak = weak_from_this(), id = observer->id] {
            auto self = weak.lock();
            if (!self)
                return;
            for (const auto& o : self->periodic_) {
                if (o->id == id)
                    self->run(o->queue, o->alive,
                              [block = o->block, time = self->currentTime()] { block(time); });
            }
        });
    const TimeObserverToken token{observer->id};
    periodic_.push_back(std::move(observer));
    updateClock();
    return token;
}

TimeObserverToken MpvPlayer::addBoundaryTimeObserverForTimes_queue_usingBlock(
    const QList<MediaTime>& times, ObserverQueue queue, std::function<void()> block) {
    BoundaryObserver observer{nextObserverId_++,
                              std::make_shared<std::atomic_bool>(true),
                              {},
                              std::move(queue),
                              std::move(block)};
    for (const MediaTime& time : times) {
        if (time.isNumeric())
            observer.seconds.append(time.seconds());
    }
    if (!observer.block || observer.seconds.isEmpty()) {
        logError(QStringLiteral("player: boundary observer refused, no valid time"));
        return {};
    }
    std::sort(observer.seconds.begin(), observer.seconds.end());
    boundaries_.push_back(std::move(observer));
    return {boundaries_.back().id};
}

void MpvPlayer::removeTimeObserver(TimeObserverToken token) {
    if (!token)
        return;
    std::erase_if(periodic_, [&](const auto& o) {
        if (o->id != token.id)
            return false;
        *o->alive = false;
        return true;
    });
    std::erase_if(boundaries_, [&](const BoundaryObserver& o) {
        if (o.id != token.id)
            return false;
        *o.alive = false;
        return true;
    });
}

void MpvPlayer::run(const ObserverQueue& queue, const Liveness& alive, std::function<void()> job) {
    // Always queued, never called from inside the player's own work, so a
    // block may do anything with the player, including dropping it.
    auto guarded = [alive, job = std::move(job)] {
        if (*alive)
            job();
    };
    if (queue)
        queue(std::move(guarded));
    else
        MainQueue::async(std::move(guarded));
}

void MpvPlayer::updateClock() {
    const bool running = rate_ > 0 && item_ && loaded_ && !endReached_ &&
                         item_->status() == PlayerItem::Status::ReadyToPlay;
    for (const auto& observer : periodic_) {
        if (!running) {
            observer->timer->stop();
            continue;
        }
        const int ms = std::max(1, int(std::lround(observer->intervalSeconds * 1000.0 / rate_)));
        if (!observer->timer->isActive() || observer->timer->interval() != ms)
            observer->timer->start(ms);
    }
}

void MpvPlayer::firePeriodicObservers() {
    if (!item_)
        return;
    const MediaTime time = currentTime();
    for (const auto& observer : periodic_)
        run(observer->queue, observer->alive, [block = observer->block, time] { block(time); });
}

void MpvPlayer::fireBoundaries(double from, double to, bool inclusiveEnd) {
    // A time fires when playback passes it: from < t <= to; at the end of
    // the item every time still ahead fires.
    for (const BoundaryObserver& observer : boundaries_) {
        const bool crossed =
            std::any_of(observer.seconds.begin(), observer.seconds.end(),
                        [&](double t) { return t > from && (t <= to || inclusiveEnd); });
        if (crossed)
            run(observer.queue, observer.alive, observer.block);
    }
}

} // namespace platform

#pragma once

#include "FakePlayerItem.h"
#include "platform/media/playback/Player.h"

#include <QList>

#include <algorithm>
#include <atomic>
#include <optional>
#include <vector>

namespace fakes {

// A player with no decoder and no clock of its own: a test moves its clock
// with advance(). Otherwise it keeps the real player's contract: the item
// loads on a later turn of the main queue; seeks land on a later turn, with
// their completions; observer blocks run on their queue (the main queue by
// default), never inside the call that fired them; the end of the item
// applies the action at the end, then posts the end notification to the
// default NotificationCenter from the main queue. Main thread only.
class FakePlayer final : public platform::Player, public std::enable_shared_from_this<FakePlayer> {
  public:
    static std::shared_ptr<FakePlayer> make(std::shared_ptr<platform::PlayerItem> item);
    ~FakePlayer() override;

    std::shared_ptr<platform::PlayerItem> currentItem() const override { return item_; }
    void replaceCurrentItemWithPlayerItem(std::shared_ptr<platform::PlayerItem> item) override;
    float rate() const override { return rate_; }
    void setRate(float rate) override;
    ActionAtItemEnd actionAtItemEnd() const override { return actionAtItemEnd_; }
    void setActionAtItemEnd(ActionAtItemEnd action) override { actionAtItemEnd_ = action; }
    platform::MediaTime currentTime() const override;
    void seekToTime(const platform::MediaTime& time) override {
        seekToTime_toleranceBefore_toleranceAfter_completionHandler(time, {}, {}, {});
    }
    void seekToTime_toleranceBefore_toleranceAfter_completionHandler(
        const platform::MediaTime& time, const platform::MediaTime& toleranceBefore,
        const platform::MediaTime& toleranceAfter, SeekCompletion completion) override;
    bool isSeeking() const override { return seekTarget_.has_value(); }
    platform::TimeObserverToken addPeriodicTimeObserverForInterval_queue_usingBlock(
        const platform::MediaTime& interval, ObserverQueue queue,
        std::function<void(platform::MediaTime)> block) override;
    platform::TimeObserverToken
    addBoundaryTimeObserverForTimes_queue_usingBlock(const QList<platform::MediaTime>& times,
                                                     ObserverQueue queue,
                                                     std::function<void()> block) override;
    void removeTimeObserver(platform::TimeObserverToken token) override;

    // Lets `seconds` of movie time play at the current rate, as the real
    // clock would: the position moves on (no further than the end), the
    // periodic observers fire, the boundary times passed fire, and reaching
    // the end ends the item. Does nothing while paused, loading or seeking.
    void advance(double seconds);

    // Every seek asked for, in order, as asked.
    const QList<platform::MediaTime>& seeks() const { return seeks_; }
    int periodicObserverCount() const { return observerCount(false); }
    int boundaryObserverCount() const { return observerCount(true); }

  private:
    FakePlayer() = default;
    struct Observer {
        std::uint64_t id;
        std::shared_ptr<std::atomic_bool> alive; // read where the block runs
        ObserverQueue queue;
        std::function<void(platform::MediaTime)> block;
        QList<double> boundaries; // in seconds; empty for a periodic observer
    };

    int observerCount(bool boundary) const {
        return int(std::count_if(observers_.begin(), observers_.end(), [&](const Observer& o) {
            return o.boundaries.isEmpty() != boundary;
        }));
    }
    void load(std::uint64_t generation);
    void land(std::uint64_t seek);
    void endSeek(bool finished);
    platform::TimeObserverToken addObserver(QList<double> boundaries, ObserverQueue queue,
                                            std::function<void(platform::MediaTime)> block);
    void notify(const Observer& observer);
    void firePeriodicObservers();
    void fireBoundaries(double from, double to, bool atEnd);

    std::shared_ptr<FakePlayerItem> item_;
    std::uint64_t generation_ = 0; // bumped by every item change
    bool loaded_ = false;
    float rate_ = 0;
    ActionAtItemEnd actionAtItemEnd_ = ActionAtItemEnd::Pause;
    double position_ = 0; // seconds
    std::optional<platform::MediaTime> seekTarget_;
    std::uint64_t seekId_ = 0; // bumped by every seek
    SeekCompletion seekCompletion_;
    QList<platform::MediaTime> seeks_;
    std::vector<Observer> observers_;
    std::uint64_t nextObserverId_ = 1;
};

} // namespace fakes

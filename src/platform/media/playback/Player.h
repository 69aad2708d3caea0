#pragma once

#include "platform/media/MediaTime.h"
#include "platform/media/playback/PlayerItem.h"
#include "platform/media/playback/TimeObserverToken.h"
#include "platform/runtime/Implementation.h"

#include <QList>
#include <QUrl>

#include <functional>
#include <memory>

namespace platform {

// Plays one item at a time: play, pause, rate, seeks, the current time, what
// to do at the item's end, and time observers.
//
// Threads: main thread only, for every call and every callback (unless a time
// observer was given another queue).
//
// Ownership: shared. The player holds its current item; a widget that shows
// the player (PlayerLayer) holds the player. Observer blocks are kept until
// removed or until the player goes, so they should capture their targets
// weakly.
//
// Video: a player needs no widget. Without one, frames are decoded and
// dropped at their display times, so time, observers and the end of the item
// behave as they do on screen; a PlayerLayer pointed at the player takes the
// frames over.
//
// End of the item: the player applies its action at the item's end, then
// posts itemDidPlayToEndNotification() for the item to the default
// NotificationCenter, from the main queue.
//
// Failure: a file that cannot be played makes the item's status Failed with
// an error; the player stays usable. When the player itself cannot start,
// every item put in it fails the same way.
class Player {
  public:
    enum class ActionAtItemEnd { Advance = 0, Pause = 1, None = 2 };

    // Where an observer block runs: a function that runs the job it is given
    // (on a worker queue, say). Empty: the main queue.
    using ObserverQueue = std::function<void(std::function<void()>)>;

    virtual ~Player() = default;

    // A player from implementation(): the real one, on libmpv, unless a test
    // replaced it; it starts loading `item` at once.
    static std::shared_ptr<Player> playerWithPlayerItem(std::shared_ptr<PlayerItem> item);
    static std::shared_ptr<Player> playerWithURL(const QUrl& url);
    using Maker = std::shared_ptr<Player>(std::shared_ptr<PlayerItem>);
    static Implementation<Maker>& implementation();

    virtual std::shared_ptr<PlayerItem> currentItem() const = 0;
    // Starts loading `item` in place of the current one (null: play nothing).
    // The new item starts at zero at the player's rate (a playing player
    // plays it once it is loaded). An item that is already in another player
    // is refused with a log line.
    virtual void replaceCurrentItemWithPlayerItem(std::shared_ptr<PlayerItem> item) = 0;

    // play() is setRate(1), pause() is setRate(0). Rates below zero or not a
    // number are refused with a log line. The rate drops to 0 by itself at
    // the item's end when the action there is Pause.
    void play() { setRate(1.0f); }
    void pause() { setRate(0.0f); }
    virtual float rate() const = 0;
    virtual void setRate(float rate) = 0;

    // Default: Pause.
    virtual ActionAtItemEnd actionAtItemEnd() const = 0;
    virtual void setActionAtItemEnd(ActionAtItemEnd action) = 0;

    // The position of the current item at the item's timescale (its first
    // video track's): invalid without an item, zero before the first report,
    // and the target of a seek from the moment it is asked for until it is
    // done.
    virtual MediaTime currentTime() const = 0;

    // Seeks show the frame at the requested time; the default tolerance and a
    // finite tolerance decode from the keyframe before up to that frame. Zero
    // tolerances ask for exactly that instant (the same frame, also for audio);
    // infinite tolerances on both sides allow stopping at the keyframe at or
    // before the time, which is fastest. Times before zero seek to zero; an
    // invalid time is ignored. A seek made before the item is loaded runs when
    // it is. `completion(finished)` runs on the main queue: true once the
    // player stands at the new position, false when another seek or another
    // item took its place.
    using SeekCompletion = std::function<void(bool finished)>;
    virtual void seekToTime(const MediaTime& time) = 0;
    void seekToTime_toleranceBefore_toleranceAfter(const MediaTime& time,
                                                   const MediaTime& toleranceBefore,
                                                   const MediaTime& toleranceAfter) {
        seekToTime_toleranceBefore_toleranceAfter_completionHandler(time, toleranceBefore,
                                                                    toleranceAfter, {});
    }
    virtual void seekToTime_toleranceBefore_toleranceAfter_completionHandler(
        const MediaTime& time, const MediaTime& toleranceBefore, const MediaTime& toleranceAfter,
        SeekCompletion completion) = 0;
    // True from a seek until it is done.
    virtual bool isSeeking() const = 0;

    // Calls `block` with the current time every `interval` of playback while
    // the rate is not zero, and once whenever playback starts, stops, or a
    // seek lands. An interval that is not a positive time is refused (null
    // token).
    virtual TimeObserverToken addPeriodicTimeObserverForInterval_queue_usingBlock(
        const MediaTime& interval, ObserverQueue queue, std::function<void(MediaTime)> block) = 0;
    // Calls `block` when normal playback reaches or passes one of `times`
    // (not when a seek jumps over it). A time at or past the end fires when
    // playback reaches the end.
    virtual TimeObserverToken addBoundaryTimeObserverForTimes_queue_usingBlock(
        const QList<MediaTime>& times, ObserverQueue queue, std::function<void()> block) = 0;
    // A token that names nothing (or an observer already removed) is ignored.
    virtual void removeTimeObserver(TimeObserverToken token) = 0;
};

} // namespace platform

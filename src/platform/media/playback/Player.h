#pragma once

#include "platform/media/MediaTime.h"
#include "platform/media/playback/PlayerItem.h"
#include "platform/media/playback/TimeObserverToken.h"

#include <QList>
#include <QUrl>

#include <atomic>
#include <functional>
#include <memory>
#include <optional>
#include <vector>

class QTimer;
struct mpv_event;

namespace platform {

class MpvCore;

// Plays one item at a time with libmpv: play, pause, rate, seeks, the current
// time, what to do at the item's end, and time observers.
//
// Threads: main thread only, for every call and every callback (unless a time
// observer was given another queue). Nothing here waits for libmpv: commands
// are queued to it and its events come back through the main queue.
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
// Failure: a file that cannot be played makes the item's status Failed with
// an error; the player stays usable. When libmpv itself cannot start, every
// item put in the player fails the same way.
class Player : public std::enable_shared_from_this<Player> {
  public:
    enum class ActionAtItemEnd { Advance = 0, Pause = 1, None = 2 };

    // Where an observer block runs: a function that runs the job it is given
    // (on a worker queue, say). Empty: the main queue.
    using ObserverQueue = std::function<void(std::function<void()>)>;

    static std::shared_ptr<Player> playerWithPlayerItem(std::shared_ptr<PlayerItem> item);
    static std::shared_ptr<Player> playerWithURL(const QUrl& url);
    ~Player();
    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    const std::shared_ptr<PlayerItem>& currentItem() const { return item_; }
    // Starts loading `item` in place of the current one (null: play nothing).
    // The new item starts at zero at the player's rate (a playing player
    // plays it once it is loaded). An item that is already in another player
    // is refused with a log line.
    void replaceCurrentItemWithPlayerItem(std::shared_ptr<PlayerItem> item);

    // play() is setRate(1), pause() is setRate(0). Rates below zero or not a
    // number are refused with a log line. The rate drops to 0 by itself at
    // the item's end when the action there is Pause.
    void play();
    void pause();
    float rate() const { return rate_; }
    void setRate(float rate);

    ActionAtItemEnd actionAtItemEnd() const { return actionAtItemEnd_; }
    void setActionAtItemEnd(ActionAtItemEnd action) { actionAtItemEnd_ = action; }

    // The position of the current item at the item's timescale (its first
    // video track's): invalid without an item, zero before the first report,
    // and the target of a seek from the moment it is asked for until it is
    // done.
    MediaTime currentTime() const;

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
    void seekToTime(const MediaTime& time);
    void seekToTime_toleranceBefore_toleranceAfter(const MediaTime& time,
                                                   const MediaTime& toleranceBefore,
                                                   const MediaTime& toleranceAfter);
    void seekToTime_toleranceBefore_toleranceAfter_completionHandler(
        const MediaTime& time, const MediaTime& toleranceBefore, const MediaTime& toleranceAfter,
        SeekCompletion completion);
    // True from a seek until it is done.
    bool isSeeking() const { return seek_.pending; }

    // Calls `block` with the current time every `interval` of playback while
    // the rate is not zero, and once whenever playback starts, stops, or a
    // seek lands. An interval that is not a positive time is refused (null
    // token).
    TimeObserverToken addPeriodicTimeObserverForInterval_queue_usingBlock(
        const MediaTime& interval, ObserverQueue queue, std::function<void(MediaTime)> block);
    // Calls `block` when normal playback reaches or passes one of `times`
    // (not when a seek jumps over it). A time at or past the end fires when
    // playback reaches the end.
    TimeObserverToken addBoundaryTimeObserverForTimes_queue_usingBlock(
        const QList<MediaTime>& times, ObserverQueue queue, std::function<void()> block);
    // A token that names nothing (or an observer already removed) is ignored.
    void removeTimeObserver(TimeObserverToken token);

    // For the video widgets of this library.
    const std::shared_ptr<MpvCore>& mpvCore() const { return core_; }

  private:
    Player();
    void start();

    // Player.cpp
    void load(std::uint64_t generation);
    void failItem(ErrorPtr error);
    void seek(const MediaTime& time, const QByteArray& mode, SeekCompletion completion);
    void issueSeek();
    void finishSeeks(bool finished);
    // Player_Events.cpp
    void handleEvent(const mpv_event& event);
    void handleLoadReply(const mpv_event& event);
    void handleFileLoaded();
    void handleEndFile(const mpv_event& event);
    void handleProperty(const mpv_event& event);
    void handlePlaybackRestart();
    void handleEndOfItem();
    void refreshPosition();
    bool hasPlayableTrack() const;
    // Player_TimeObservers.cpp
    struct PeriodicObserver;
    struct BoundaryObserver;
    void updateClock();
    void firePeriodicObservers();
    void fireBoundaries(double from, double to, bool inclusiveEnd);
    void run(const ObserverQueue& queue, const std::shared_ptr<std::atomic_bool>& alive,
             std::function<void()> job);

    std::shared_ptr<MpvCore> core_;
    ErrorPtr startError_;
    std::shared_ptr<PlayerItem> item_;
    std::uint64_t generation_ = 0; // bumped by every item change
    // libmpv's ids of its files: the one loaded for the current item (known
    // once the load is answered), and the last ones it started and opened.
    std::int64_t expectedEntry_ = -1;
    std::int64_t startedEntry_ = -1;
    std::int64_t openedEntry_ = -1;
    bool loaded_ = false;
    bool endReached_ = false;
    bool mpvPaused_ = true; // libmpv's own pause state, as reported
    float rate_ = 0;
    ActionAtItemEnd actionAtItemEnd_ = ActionAtItemEnd::Pause;

    std::optional<double> position_; // seconds, as libmpv last reported
    double crossingFrom_ = 0;        // where boundary crossings are measured from

    struct SeekState {
        bool pending = false;
        MediaTime target;
        QByteArray mode; // libmpv's seek flags
        bool issued = false;
        int repliesOutstanding = 0;
        // libmpv has begun the latest seek: its seek event came after every
        // seek command was answered. Only then is a restart this seek's.
        bool started = false;
        std::optional<double> landing; // position reported since it started
        std::vector<SeekCompletion> completions;
    } seek_;

    std::vector<std::unique_ptr<PeriodicObserver>> periodic_;
    std::vector<BoundaryObserver> boundaries_;
    std::uint64_t nextObserverId_ = 1;
};

} // namespace platform

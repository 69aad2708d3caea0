#pragma once

#include "platform/media/playback/MpvPlayerItem.h"
#include "platform/media/playback/Player.h"

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

// The player on libmpv. Each player runs a libmpv core of its own; the video
// widgets of this library (MpvPlayerLayer) draw its frames. Plays only the
// items of this library (MpvPlayerItem); another kind of item is refused with
// a log line.
//
// Threads: as Player. Commands and property writes are queued to libmpv and
// never wait; its events come back through the main queue. Three reads do
// wait for libmpv's core to answer, on the main thread: the track list and
// the duration when a file has opened, and the position when a file has
// opened or a seek has landed without reporting one. Each is one property
// read, but it waits while the core is busy with other work.
class MpvPlayer final : public Player, public std::enable_shared_from_this<MpvPlayer> {
  public:
    static std::shared_ptr<MpvPlayer> make(std::shared_ptr<PlayerItem> item);
    ~MpvPlayer() override;
    MpvPlayer(const MpvPlayer&) = delete;
    MpvPlayer& operator=(const MpvPlayer&) = delete;

    std::shared_ptr<PlayerItem> currentItem() const override { return item_; }
    void replaceCurrentItemWithPlayerItem(std::shared_ptr<PlayerItem> item) override;
    float rate() const override { return rate_; }
    void setRate(float rate) override;
    ActionAtItemEnd actionAtItemEnd() const override { return actionAtItemEnd_; }
    void setActionAtItemEnd(ActionAtItemEnd action) override { actionAtItemEnd_ = action; }
    MediaTime currentTime() const override;
    void seekToTime(const MediaTime& time) override;
    void seekToTime_toleranceBefore_toleranceAfter_completionHandler(
        const MediaTime& time, const MediaTime& toleranceBefore, const MediaTime& toleranceAfter,
        SeekCompletion completion) override;
    bool isSeeking() const override { return seek_.pending; }
    TimeObserverToken addPeriodicTimeObserverForInterval_queue_usingBlock(
        const MediaTime& interval, ObserverQueue queue,
        std::function<void(MediaTime)> block) override;
    TimeObserverToken addBoundaryTimeObserverForTimes_queue_usingBlock(
        const QList<MediaTime>& times, ObserverQueue queue, std::function<void()> block) override;
    void removeTimeObserver(TimeObserverToken token) override;

    // For the video widgets of this library.
    const std::shared_ptr<MpvCore>& mpvCore() const { return core_; }

  private:
    MpvPlayer();
    void start();

    // MpvPlayer.cpp
    void load(std::uint64_t generation);
    void failItem(ErrorPtr error, bool quietly = false);
    void seek(const MediaTime& time, const QByteArray& mode, SeekCompletion completion);
    void issueSeek();
    void finishSeeks(bool finished);
    // MpvPlayer_Events.cpp
    void handleEvent(const mpv_event& event);
    void handleLoadReply(const mpv_event& event);
    void handleFileLoaded();
    void handleEndFile(const mpv_event& event);
    void handleProperty(const mpv_event& event);
    void handlePlaybackRestart();
    void handleEndOfItem();
    void refreshPosition();
    bool hasPlayableTrack() const;
    // MpvPlayer_TimeObservers.cpp
    struct PeriodicObserver;
    struct BoundaryObserver;
    void updateClock();
    void firePeriodicObservers();
    void fireBoundaries(double from, double to, bool inclusiveEnd);
    void run(const ObserverQueue& queue, const std::shared_ptr<std::atomic_bool>& alive,
             std::function<void()> job);

    std::shared_ptr<MpvCore> core_;
    ErrorPtr startError_;
    std::shared_ptr<MpvPlayerItem> item_;
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

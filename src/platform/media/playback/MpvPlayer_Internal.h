#pragma once

// Shared by the Player_*.cpp files only.

#include "MpvPlayer.h"

#include <QTimer>

#include <mpv/client.h>

#include <atomic>
#include <cstdint>
#include <memory>

namespace platform {

// reply_userdata of the properties the player observes and of its commands.
enum : std::uint64_t {
    kTimePos = 1,
    kPause,
    kEofReached,
    kDuration,
    kCacheState,
    kSeekReply = 100,
    // A load's reply is this plus the generation of the item it loads.
    kLoadReplyBase = std::uint64_t(1) << 32,
};

struct PropertyId {
    std::uint64_t id;
    const char* name;
    mpv_format format;
};

inline const PropertyId (&observedProperties())[5] {
    static const PropertyId properties[5] = {
        {kTimePos, "time-pos", MPV_FORMAT_DOUBLE},
        {kPause, "pause", MPV_FORMAT_FLAG},
        {kEofReached, "eof-reached", MPV_FORMAT_FLAG},
        {kDuration, "duration", MPV_FORMAT_DOUBLE},
        {kCacheState, "demuxer-cache-state", MPV_FORMAT_NODE},
    };
    return properties;
}

// The spans in libmpv's "demuxer-cache-state" node, at `timescale`.
QList<MediaTimeRange> seekableRanges(const mpv_node& cacheState, std::int32_t timescale);

// Cleared when the observer is removed, so blocks already queued stay quiet.
using Liveness = std::shared_ptr<std::atomic_bool>;

struct MpvPlayer::PeriodicObserver {
    std::uint64_t id;
    Liveness alive;
    double intervalSeconds;
    ObserverQueue queue;
    std::function<void(MediaTime)> block;
    std::unique_ptr<QTimer> timer;
};

struct MpvPlayer::BoundaryObserver {
    std::uint64_t id;
    Liveness alive;
    QList<double> seconds; // sorted
    ObserverQueue queue;
    std::function<void()> block;
};

} // namespace platform

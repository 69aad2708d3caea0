#pragma once

#include <cstdint>

namespace platform {

// Names a time observer added to a player, for removeTimeObserver. A default
// token names nothing. Plain value; dropping it does not remove the observer.
struct TimeObserverToken {
    std::uint64_t id = 0;

    explicit operator bool() const { return id != 0; }
    friend bool operator==(const TimeObserverToken&, const TimeObserverToken&) = default;
};

} // namespace platform

#include "Activity.h"

#include <utility>

namespace platform {

Activity::~Activity() = default;

void Activity::activityDidFinish(bool completed) {
    if (finished_)
        return;
    finished_ = true;
    // The handler may drop the last reference to this activity.
    if (auto report = std::exchange(onFinish_, {}))
        report(completed);
}

void Activity::setFinishHandler(std::function<void(bool completed)> handler) {
    onFinish_ = std::move(handler);
    finished_ = false;
}

} // namespace platform

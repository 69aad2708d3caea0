#pragma once

#include <chrono>
#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <thread>

namespace platform {

// Runs `work` on a thread of its own and waits for it at most `bound`: its
// result, or nullopt when the bound passed first. For work that may block on
// a file that does not answer (a stalled network share, a device), whose
// caller must not block with it. Work that outlives its bound goes on alone
// and its result is dropped when it ends; it must hold what it uses (capture
// by value). Any thread.
template <typename T>
std::optional<T> runWithin(std::chrono::milliseconds bound, std::function<T()> work) {
    struct Shared {
        std::mutex mutex;
        std::condition_variable done;
        std::optional<T> result;
    };
    auto shared = std::make_shared<Shared>();
    std::thread([shared, work = std::move(work)] {
        T value = work();
        std::lock_guard lock(shared->mutex);
        shared->result = std::move(value);
        shared->done.notify_all();
    }).detach();
    std::unique_lock lock(shared->mutex);
    shared->done.wait_for(lock, bound, [&] { return shared->result.has_value(); });
    return std::move(shared->result);
}

} // namespace platform

#pragma once

#include <functional>

namespace platform {

enum class QueuePriority { Background, Default };

// The process-wide concurrent worker queues. Jobs run on pool threads, in no
// particular order and possibly at the same time; nothing is serialised.
namespace GlobalQueue {

// Queues `job` on the pool of that priority and returns at once. Callable from
// any thread. The job and what it captures live until it has run.
void async(QueuePriority priority, std::function<void()> job);

// Blocks until every queued job of both pools has finished. The applications
// call it when they quit, so work already queued (a removal, a move, an album
// write) is never cut off. Called on the main thread, it keeps running the
// main queue meanwhile, so a job that waits on the main queue can finish.
void drain();

// True when the calling thread is one of the pools' threads.
bool isWorkerThread();

} // namespace GlobalQueue
} // namespace platform

#pragma once

#include <functional>

namespace platform {

// The main queue is the event loop of the thread that created the
// QCoreApplication (the GUI thread). Only that thread touches views and
// editor state.
namespace MainQueue {

// Queues `job` to run on the main thread after the work already queued there.
// Callable from any thread, including the main thread itself (the job then
// runs on a later turn of the loop, never inside this call). The job, and
// everything it captures, lives until it has run. Without a QCoreApplication
// the job is dropped and an error is logged.
void async(std::function<void()> job);

// Runs `job` on the main thread and returns when it has finished. On the main
// thread it runs at once; from another thread the caller blocks until the
// event loop has run it, so the main thread must not be waiting on the caller.
void sync(const std::function<void()>& job);

// True on the main thread.
bool isCurrent();

// Runs what is queued on the main thread, and what that queues in turn
// (deferred deletions too), until nothing is left or `rounds` passes have
// run. Main thread only. Call it before the application object goes: work
// still queued then would be destroyed inside its destructor.
void runPending(int rounds = 8);

} // namespace MainQueue
} // namespace platform

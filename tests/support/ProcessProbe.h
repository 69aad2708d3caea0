#pragma once

#include <QtGlobal>
#include <functional>

namespace testing_support {

// The pid of a child process of `parent`, or 0 when it has none (yet).
qint64 childOf(qint64 parent);

// Whether the process is gone (or only a zombie waiting to be reaped).
bool processEnded(qint64 pid);

// Polls `condition` every `intervalMs` (without running an event loop) until
// it holds or `timeoutMs` passes; returns whether it holds.
bool pollUntil(const std::function<bool()>& condition, int timeoutMs, int intervalMs = 1);

} // namespace testing_support

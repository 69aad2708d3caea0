#pragma once

#include <functional>

namespace testing_support {

// Runs the main thread's event loop until `condition` holds or `timeoutMs`
// passes; returns whether it holds. For completions that hop to the main
// queue.
bool waitUntil(const std::function<bool()>& condition, int timeoutMs = 10000);

} // namespace testing_support

#pragma once

#include <QString>
#include <memory>

namespace platform {

// Files that queued work is about to read. A service that queues a read of a
// file (the album importing a clip) takes a hold on it when the work is
// asked for; a removal of the file waits until every hold is released, which
// the reader does once it has the file open. So a removal asked for later
// never overtakes a read asked for earlier, whatever queues the two run on.
//
// Thread-safe. Paths are host paths; "/a//b/" and "/a/b" are one file.
namespace FileHolds {

// A hold on `hostPath`, released when the last copy of the handle goes.
std::shared_ptr<void> hold(const QString& hostPath);

// Returns once no hold on `hostPath` is left. Holders release as soon as they
// have the file open, so the wait is short; never wait from work that a
// holder itself waits for.
void waitForRelease(const QString& hostPath);

} // namespace FileHolds
} // namespace platform

#pragma once

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <functional>

namespace platform {

// Runs an outside program without blocking the main thread. `done` runs on
// the main thread exactly once with the exit code (-1 when the program could
// not start, crashed or outlived `timeoutMs`, which kills it) and what it
// wrote to stdout. Main thread only.
void runProcess(const QString& program, const QStringList& arguments, int timeoutMs,
                std::function<void(int exitCode, const QByteArray& output)> done);

} // namespace platform

#pragma once

#include <QString>
#include <functional>
#include <memory>

namespace platform {

// The levels of the system log, and the process console beside it.
enum class LogLevel {
    Default, // the system log's default level (syslog notice)
    Error,   // the system log's error level (syslog err)
    Console, // the process's console (stderr), not the system log
};

// Where log lines go. Lines arrive whole, without a trailing newline, on any
// thread; a sink must be safe to call from several threads at once.
class LogSink {
  public:
    virtual ~LogSink() = default;
    virtual void write(LogLevel level, const QString& line) = 0;
};

// Writes one line. Callable from any thread. Lines are the system's own texts,
// byte for byte; the sink adds nothing but the process identification that
// syslog adds.
void log(LogLevel level, const QString& line);
inline void logDefault(const QString& line) {
    log(LogLevel::Default, line);
}
inline void logError(const QString& line) {
    log(LogLevel::Error, line);
}
inline void logConsole(const QString& line) {
    log(LogLevel::Console, line);
}

// Replaces the sink that receives every line and returns the one it replaces.
// Passing null restores the system sink (syslog and stderr). With
// TAMSEL_LOG_STDERR=1 in the environment, every line is also mirrored to
// stderr whichever sink is installed.
std::shared_ptr<LogSink> setLogSink(std::shared_ptr<LogSink> sink);

// An observer sees every line after the sink has; the automation driver waits
// on it. Returns a token for removeLogObserver.
using LogObserver = std::function<void(LogLevel, const QString&)>;
int addLogObserver(LogObserver observer);
void removeLogObserver(int token);

const char* logLevelName(LogLevel level);

} // namespace platform

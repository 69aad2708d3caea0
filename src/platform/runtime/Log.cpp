#include "Log.h"

#include <QByteArray>
#include <cstdio>
#include <map>
#include <mutex>
#include <syslog.h>

namespace platform {
namespace {

class SystemSink final : public LogSink {
  public:
    SystemSink() { openlog("tamsel", LOG_PID, LOG_USER); }

    void write(LogLevel level, const QString& line) override {
        const QByteArray bytes = line.toUtf8();
        switch (level) {
        case LogLevel::Default:
            syslog(LOG_NOTICE, "%s", bytes.constData());
            break;
        case LogLevel::Error:
            syslog(LOG_ERR, "%s", bytes.constData());
            break;
        case LogLevel::Console:
            std::fprintf(stderr, "%s\n", bytes.constData());
            break;
        }
    }
};

struct LogState {
    std::mutex mutex;
    std::shared_ptr<LogSink> sink;
    std::map<int, LogObserver> observers;
    int nextToken = 1;
};

LogState& state() {
    static LogState s;
    return s;
}

std::shared_ptr<LogSink> systemSink() {
    static auto sink = std::make_shared<SystemSink>();
    return sink;
}

bool mirrorToStderr() {
    static const bool mirror = qgetenv("TAMSEL_LOG_STDERR") == "1";
    return mirror;
}

} // namespace

const char* logLevelName(LogLevel level) {
    switch (level) {
    case LogLevel::Default:
        return "default";
    case LogLevel::Error:
        return "error";
    case LogLevel::Console:
        return "console";
    }
    return "?";
}

void log(LogLevel level, const QString& line) {
    std::shared_ptr<LogSink> sink;
    std::map<int, LogObserver> observers;
    {
        std::lock_guard lock(state().mutex);
        sink = state().sink ? state().sink : systemSink();
        observers = state().observers;
    }
    sink->write(level, line);
    // Console lines already reach stderr through the system sink.
    if (mirrorToStderr() && !(level == LogLevel::Console && sink == systemSink()))
        std::fprintf(stderr, "[%s] %s\n", logLevelName(level), line.toUtf8().constData());
    for (auto& [token, observer] : observers)
        observer(level, line);
}

std::shared_ptr<LogSink> setLogSink(std::shared_ptr<LogSink> sink) {
    std::lock_guard lock(state().mutex);
    std::swap(state().sink, sink);
    return sink;
}

int addLogObserver(LogObserver observer) {
    std::lock_guard lock(state().mutex);
    const int token = state().nextToken++;
    state().observers.emplace(token, std::move(observer));
    return token;
}

void removeLogObserver(int token) {
    std::lock_guard lock(state().mutex);
    state().observers.erase(token);
}

} // namespace platform

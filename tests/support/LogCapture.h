#pragma once

#include "platform/runtime/Log.h"

#include <QList>
#include <QString>
#include <memory>
#include <mutex>

namespace testing_support {

struct LogLine {
    platform::LogLevel level;
    QString text;
    bool operator==(const LogLine&) const = default;
};

// Installs itself as the log sink for its lifetime and records every line.
class LogCapture {
  public:
    LogCapture();
    ~LogCapture();
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    QList<LogLine> lines() const;
    QStringList texts() const;
    // Lines equal to `text` (any level, or the given one).
    int count(const QString& text) const;
    int count(platform::LogLevel level, const QString& text) const;
    // Lines that start with `prefix`.
    QList<LogLine> startingWith(const QString& prefix) const;
    void clear();

  private:
    class Sink;
    std::shared_ptr<Sink> sink_;
    std::shared_ptr<platform::LogSink> previous_;
};

} // namespace testing_support

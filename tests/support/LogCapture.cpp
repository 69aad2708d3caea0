#include "LogCapture.h"

namespace testing_support {

class LogCapture::Sink final : public platform::LogSink {
  public:
    void write(platform::LogLevel level, const QString& line) override {
        std::lock_guard lock(mutex);
        lines.append({level, line});
    }
    mutable std::mutex mutex;
    QList<LogLine> lines;
};

LogCapture::LogCapture() : sink_(std::make_shared<Sink>()) {
    previous_ = platform::setLogSink(sink_);
}

LogCapture::~LogCapture() {
    platform::setLogSink(previous_);
}

QList<LogLine> LogCapture::lines() const {
    std::lock_guard lock(sink_->mutex);
    return sink_->lines;
}

QStringList LogCapture::texts() const {
    QStringList out;
    for (const LogLine& line : lines())
        out.append(line.text);
    return out;
}

int LogCapture::count(const QString& text) const {
    return int(texts().count(text));
}

int LogCapture::count(platform::LogLevel level, const QString& text) const {
    return int(lines().count(LogLine{level, text}));
}

QList<LogLine> LogCapture::startingWith(const QString& prefix) const {
    QList<LogLine> out;
    for (const LogLine& line : lines())
        if (line.text.startsWith(prefix))
            out.append(line);
    return out;
}

void LogCapture::clear() {
    std::lock_guard lock(sink_->mutex);
    sink_->lines.clear();
}

} // namespace testing_support

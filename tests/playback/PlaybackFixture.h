#pragma once

#include "MediaGenerator.h"
#include "platform/media/playback/Player.h"

#include <QString>
#include <QUrl>

#include <memory>

namespace playback_test {

// Clips made once per test process, in a directory removed at exit.
// `name` identifies the clip; the same name returns the same file.
QString clipPath(const QString& name, const testmedia::MovieSpec& movieSpec);
QUrl clipUrl(const QString& name, const testmedia::MovieSpec& movieSpec);
// A file in the same directory with the given bytes.
QUrl fileWithBytes(const QString& name, const QByteArray& bytes);

// The common clips: one second at 30 fps with sound, and two seconds with a
// keyframe every 30 frames.
testmedia::MovieSpec oneSecond();
testmedia::MovieSpec twoSeconds();

// Waits until the item's status leaves Unknown; returns it.
platform::PlayerItem::Status waitForStatus(const std::shared_ptr<platform::PlayerItem>& item,
                                           int timeoutMs = 10000);

// Counts the end notifications whose object is `item`, while alive.
class EndWatcher {
  public:
    explicit EndWatcher(const std::shared_ptr<platform::PlayerItem>& item);
    ~EndWatcher();
    EndWatcher(const EndWatcher&) = delete;
    EndWatcher& operator=(const EndWatcher&) = delete;
    int count() const { return count_; }
    bool onMainThread() const { return onMainThread_; }

  private:
    int count_ = 0;
    bool onMainThread_ = true;
};

} // namespace playback_test

#pragma once

#include "MediaGenerator.h"
#include "platform/media/playback/Player.h"

#include <QString>
#include <QUrl>

#include <memory>

namespace playback_test {

// Clips made once per test process, in a directory removed at exit: the
// same name gives the same file.
QUrl clipUrl(const QString& name, const testmedia::MovieSpec& movieSpec);
// A plain clip of 30 fps with sound and a keyframe every 30 frames.
testmedia::MovieSpec plain(double seconds);
QUrl clip(double seconds);
// A file in the same directory with the given bytes.
QUrl fileWithBytes(const QString& name, const QByteArray& bytes);

// Waits until the item's status leaves Unknown; returns it.
platform::PlayerItem::Status waitForStatus(const std::shared_ptr<platform::PlayerItem>& item);
// A player of `item`, once the item is ready to play.
std::shared_ptr<platform::Player> readyPlayer(const std::shared_ptr<platform::PlayerItem>& item);

// Counts the end notifications whose object is `item`, while alive; each
// must come on the main thread.
class EndWatcher {
  public:
    explicit EndWatcher(const std::shared_ptr<platform::PlayerItem>& item);
    ~EndWatcher();
    EndWatcher(const EndWatcher&) = delete;
    EndWatcher& operator=(const EndWatcher&) = delete;
    int count() const { return count_; }
    // Waits for the `n`th notification.
    bool waitFor(int n) const;

  private:
    int count_ = 0;
};

} // namespace playback_test

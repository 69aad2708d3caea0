#pragma once

#include "platform/runtime/Error.h"

#include <QDateTime>
#include <QObject>
#include <QTimer>

#include <functional>

namespace youtube_publishing {

// Waits until the file to publish is complete. The editor's export writes
// under a temporary name beside its output (".NAME.*.part") and renames the
// file into place only when it is whole, so the file's presence means it is
// complete, and a partial file that grows means the export is alive. When
// neither the file nor a partial file has appeared or grown for the stall
// timeout, the export is taken to have failed: MediaNotReady.
//
// Main thread only; the handler is called once, later, unless wait() is
// called again or the waiter is destroyed first.
class MediaFileWaiter : public QObject {
    Q_OBJECT
  public:
    explicit MediaFileWaiter(QObject* parent = nullptr);

    void wait(const QString& hostPath, std::function<void(platform::ErrorPtr error)> handler);
    void stop();

    // Defaults: 60 s without any sign of the export, a look every 200 ms.
    void setStallTimeout(int milliseconds) { stallTimeoutMs_ = milliseconds; }
    void setPollInterval(int milliseconds) { timer_.setInterval(milliseconds); }

  private:
    void look();
    qint64 partialBytes() const;

    QString path_;
    std::function<void(platform::ErrorPtr)> handler_;
    QTimer timer_;
    int stallTimeoutMs_ = 60000;
    qint64 lastPartialBytes_ = -1;
    QDateTime lastSign_;
};

} // namespace youtube_publishing

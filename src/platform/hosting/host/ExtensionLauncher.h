#pragma once

#include "platform/hosting/ExtensionItem.h"

#include <QObject>
#include <QProcess>
#include <QStringList>
#include <QTimer>
#include <memory>

namespace platform {

class MessageChannel;

// The host side of an extension request: starts the extension in a process of
// its own with one end of a socket pair, sends it the input items, and
// reports what it says back. Lives on the thread that made it (it needs that
// thread's event loop); its signals are emitted there.
class ExtensionLauncher : public QObject {
    Q_OBJECT
  public:
    explicit ExtensionLauncher(QObject* parent = nullptr);
    ~ExtensionLauncher() override;

    // Starts `program` with `arguments` and sends the request. False, with
    // `error` set, when the process cannot be started.
    bool start(const QString& program, const QStringList& arguments,
               const QList<ExtensionItem>& inputItems, QString* error = nullptr);

    // The host closes the extension: it is asked to end, and given the time
    // its queued work takes (an album write of a large recording may take
    // minutes); it is killed only when it has fallen silent for `graceMs`,
    // neither ending nor saying it is still at work.
    void dismiss(int graceMs = 10000);

    bool isRunning() const;
    QProcess& process() { return process_; }

  signals:
    // The extension's extensionDidFinishWithActivityTypes: message.
    void extensionDidFinishWithActivityTypes(const QStringList& activityTypes);
    // The extension process has ended: `crashed` when it died of a signal or
    // ended with a non-zero status.
    void extensionEnded(int exitCode, bool crashed);

  private:
    QProcess process_;
    std::shared_ptr<MessageChannel> channel_;
    QTimer killTimer_; // runs from the dismissal on; each word from the extension restarts it
};

} // namespace platform

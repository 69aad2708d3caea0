#pragma once

#include "AutomationScript.h"
#include "ExtensionEntry.h"

#include <QDeadlineTimer>
#include <QKeySequence>
#include <QObject>
#include <QStringList>
#include <functional>
#include <mutex>

// Runs an automation script against the editor of an extension request, one
// command after another, through the paths a user's input takes: synthetic
// mouse presses on the toolbar buttons and the overlay, mouse drags on the
// scrubber, key presses to the focused control (or the window), the window's
// shake entry, window resizes. Main thread only.
//
// When the script has run, the request ends (as if the host dismissed the
// editor). A command that fails prints why on stderr and ends the request;
// failed() then says so.
class AutomationDriver : public QObject {
    Q_OBJECT
  public:
    AutomationDriver(ExtensionEntry& entry, QList<AutomationCommand> commands);
    ~AutomationDriver() override;

    // Starts with the first command on the next turn of the event loop.
    void start();
    bool failed() const { return failed_; }

  private:
    void runNext();
    void finish(const QString& failure = QString());
    TXVideoEditorViewController* editor() const;

    // Each returns an empty string on success, else why it failed.
    QString tap(const QString& name);
    QString drag(const QString& part, double seconds);
    // Picks an activity in the open share sheet, or cancels the sheet, as
    // the user would: a click on its row, the Escape key.
    QString share(const QString& typeOrTitle);
    void key(const QKeySequence& key);
    // Polls the condition until it holds or the timeout passes.
    void wait(const AutomationCommand& command);
    void pollWait();
    // Tries `attempt` (empty result: done, else why not yet) until it
    // succeeds or `timeout` seconds pass, then goes on with the next command
    // or fails with the last reason.
    void retry(std::function<QString()> attempt, double timeout);
    void pollRetry();
    bool holds(const AutomationCommand& command);

    ExtensionEntry& entry_;
    QList<AutomationCommand> commands_;
    int next_ = 0;
    bool failed_ = false;
    bool done_ = false;
    AutomationCommand waiting_;
    QDeadlineTimer waitDeadline_;
    std::function<QString()> retrying_;

    // Every log line since the driver was made; `wait log` consumes them in
    // order.
    int logObserver_ = 0;
    std::mutex logMutex_;
    QStringList logLines_;
    qsizetype logCursor_ = 0;
};

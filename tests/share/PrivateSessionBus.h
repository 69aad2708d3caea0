#pragma once

#include <QDBusConnection>
#include <QProcess>
#include <QString>

namespace testing_support {

// A D-Bus session bus of the test's own (dbus-daemon --session), so fakes of
// desktop services can own their names on it without touching the user's
// session. isRunning() is false when dbus-daemon is not installed.
class PrivateSessionBus {
  public:
    PrivateSessionBus();
    ~PrivateSessionBus();
    bool isRunning() const { return !address_.isEmpty(); }
    // A new connection to the bus under `name` (connections are per name).
    QDBusConnection connect(const QString& name) const;

  private:
    QProcess daemon_;
    QString address_;
    QStringList names_;
};

} // namespace testing_support

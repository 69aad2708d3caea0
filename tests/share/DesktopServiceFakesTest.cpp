// The D-Bus ways out: the portal's Email interface (used inside a sandbox)
// and the file manager's ShowItems, against fakes of those services on a
// private session bus.

#include "ShareFakes.h"
#include "platform/ui/share/DBusFileManager.h"
#include "platform/ui/share/PortalMailComposer.h"
#include "support/Wait.h"

#include <QDBusArgument>
#include <QDBusConnectionInterface>
#include <QDBusMessage>
#include <QDBusMetaType>
#include <QDBusObjectPath>
#include <QDBusUnixFileDescriptor>
#include <QFile>
#include <QProcess>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QTimer>
#include <gtest/gtest.h>
#include <unistd.h>

using namespace platform;
using namespace testing_support;

namespace {

// org.freedesktop.portal.Email as a desktop portal serves it: the call
// returns the request's path, and the answer comes as that request's
// Response signal. Reads the attachments through the descriptors it gets.
class FakeEmailPortal : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.portal.Email")
    Q_PROPERTY(uint version READ version)
  public:
    explicit FakeEmailPortal(QDBusConnection bus) : bus_(std::move(bus)) {}
    uint version() const { return 3; }
    uint answer = 0;
    QVariantMap options;
    QList<QByteArray> attachments;

  public slots:
    QDBusObjectPath ComposeEmail(const QString&, const QVariantMap& received,
                                 const QDBusMessage& message) {
        options = received;
        QList<QDBusUnixFileDescriptor> fds;
        received.value("attachment_fds").value<QDBusArgument>() >> fds;
        for (const QDBusUnixFileDescriptor& fd : fds) {
            QFile file;
            file.open(::dup(fd.fileDescriptor()), QIODevice::ReadOnly, QFile::AutoCloseHandle);
            attachments.append(file.readAll());
        }
        QString sender = message.service().mid(1).replace('.', '_');
        const QString path = "/org/freedesktop/portal/desktop/request/" + sender + "/" +
                             received.value("handle_token").toString();
        QTimer::singleShot(10, this, [this, path] {
            QDBusMessage response =
                QDBusMessage::createSignal(path, "org.freedesktop.portal.Request", "Response");
            response << answer << QVariantMap();
            bus_.send(response);
        });
        return QDBusObjectPath(path);
    }

  private:
    QDBusConnection bus_;
};

class FakeFileManager1 : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.FileManager1")
  public:
    QStringList shown;
  public slots:
    void ShowItems(const QStringList& uris, const QString&) { shown += uris; }
};

// A D-Bus session bus of the test's own, so the fakes own their names on it
// without touching the user's session; skipped without dbus-daemon.
class DesktopServicesTest : public ::testing::Test {
  protected:
    void SetUp() override {
        const QString program = QStandardPaths::findExecutable("dbus-daemon");
        if (program.isEmpty())
            GTEST_SKIP() << "dbus-daemon is not installed";
        daemon.start(program, {"--session", "--nofork", "--print-address"});
        ASSERT_TRUE(daemon.waitForStarted(5000));
        while (!daemon.canReadLine() && daemon.waitForReadyRead(5000)) {
        }
        address = QString::fromUtf8(daemon.readLine()).trimmed();
        ASSERT_FALSE(address.isEmpty());
        qDBusRegisterMetaType<QList<QDBusUnixFileDescriptor>>();
    }
    void TearDown() override {
        for (const char* name : {"service", "client"})
            QDBusConnection::disconnectFromBus(name);
        daemon.terminate();
        daemon.waitForFinished(3000);
    }
    QDBusConnection connect(const char* name) {
        return QDBusConnection::connectToBus(address, name);
    }
    QProcess daemon;
    QString address;
};

} // namespace

TEST_F(DesktopServicesTest, ThePortalGetsTheBodyAndTheAttachmentsAsDescriptors) {
    QDBusConnection service = connect("service");
    PortalMailComposer composer(connect("client"));
    const auto available = [&] {
        return awaited<bool>([&](auto done) { composer.checkAvailability(done); });
    };
    EXPECT_EQ(available(), false) << "no portal on the bus yet";
    FakeEmailPortal portal(service);
    ASSERT_TRUE(service.registerObject("/org/freedesktop/portal/desktop", &portal,
                                       QDBusConnection::ExportAllSlots |
                                           QDBusConnection::ExportAllProperties));
    ASSERT_TRUE(service.registerService("org.freedesktop.portal.Desktop"));
    EXPECT_EQ(available(), true);

    QTemporaryDir dir;
    writeText(dir.filePath("clip.mp4"), "not really a movie");
    MailDraft draft;
    draft.body = "Check out my recording of Racer by Example Games!";
    draft.attachments = {QUrl::fromLocalFile(dir.filePath("clip.mp4"))};
    const auto compose = [&] {
        return awaited<bool>([&](auto done) { composer.compose(draft, done); });
    };
    EXPECT_EQ(compose(), true);
    EXPECT_EQ(portal.options.value("body").toString(), draft.body);
    EXPECT_EQ(portal.attachments, QList<QByteArray>{"not really a movie"});
    portal.answer = 1; // the user closed the chooser
    EXPECT_EQ(compose(), false);
}

TEST_F(DesktopServicesTest, ShowItemsReachesTheFileManagerAndFailsWithoutOne) {
    QDBusConnection service = connect("service");
    DBusFileManager files(connect("client"));
    const auto show = [&] {
        return awaited<bool>([&](auto done) {
            files.showItems({QUrl::fromLocalFile("/tmp/with space/Racer.mp4")}, done);
        });
    };
    EXPECT_EQ(show(), false) << "no file manager on the bus";
    FakeFileManager1 manager;
    ASSERT_TRUE(service.registerObject("/org/freedesktop/FileManager1", &manager,
                                       QDBusConnection::ExportAllSlots));
    ASSERT_TRUE(service.registerService("org.freedesktop.FileManager1"));
    EXPECT_EQ(show(), true);
    EXPECT_EQ(manager.shown, QStringList{"file:///tmp/with%20space/Racer.mp4"});
}

#include "DesktopServiceFakesTest.moc"

#include "PortalMailComposer.h"

#include "platform/runtime/Log.h"
#include "platform/ui/share/PortalRequest.h"

#include <QCoreApplication>
#include <QDBusMessage>
#include <QDBusMetaType>
#include <QDBusPendingCallWatcher>
#include <QDBusPendingReply>
#include <QDBusUnixFileDescriptor>
#include <QDBusVariant>
#include <QFile>
#include <QPointer>

#include <fcntl.h>
#include <unistd.h>

namespace platform {

namespace {
const QString kService = QStringLiteral("org.freedesktop.portal.Desktop");
const QString kPath = QStringLiteral("/org/freedesktop/portal/desktop");
const QString kInterface = QStringLiteral("org.freedesktop.portal.Email");
// The user may keep the mail program's chooser open a long time.
constexpr int kResponseTimeoutMs = 10 * 60 * 1000;

void onReply(const QDBusPendingCall& call, std::function<void(const QDBusMessage&)> handle) {
    auto* watcher = new QDBusPendingCallWatcher(call, QCoreApplication::instance());
    QObject::connect(watcher, &QDBusPendingCallWatcher::finished, watcher,
                     [handle = std::move(handle)](QDBusPendingCallWatcher* finished) {
                         finished->deleteLater();
                         handle(finished->reply());
                     });
}
} // namespace

PortalMailComposer::PortalMailComposer(QDBusConnection bus) : bus_(std::move(bus)) {
    qDBusRegisterMetaType<QList<QDBusUnixFileDescriptor>>();
}

void PortalMailComposer::checkAvailability(std::function<void(bool available)> done) {
    if (!bus_.isConnected()) {
        done(false);
        return;
    }
    QDBusMessage get = QDBusMessage::createMethodCall(
        kService, kPath, QStringLiteral("org.freedesktop.DBus.Properties"), QStringLiteral("Get"));
    get << kInterface << QStringLiteral("version");
    onReply(bus_.asyncCall(get, 5000), [done = std::move(done)](const QDBusMessage& reply) {
        done(reply.type() == QDBusMessage::ReplyMessage);
    });
}

void PortalMailComposer::compose(const MailDraft& draft,
                                 std::function<void(bool handedOver)> done) {
    auto* request = new PortalRequest(
        bus_,
        [done](uint response, const QVariantMap&) {
            if (response == 0)
                logDefault(QStringLiteral(
                    "MailActivity: the portal handed the draft to the mail program"));
            else
                logError(QStringLiteral("MailActivity: the portal answered %1").arg(response));
            done(response == 0);
        },
        kResponseTimeoutMs);

    QVariantMap options;
    options.insert(QStringLiteral("handle_token"), request->handleToken());
    if (!draft.subject.isEmpty())
        options.insert(QStringLiteral("subject"), draft.subject);
    options.insert(QStringLiteral("body"), draft.body);
    QList<QDBusUnixFileDescriptor> descriptors;
    for (const QUrl& file : draft.attachments) {
        const int fd =
            ::open(QFile::encodeName(file.toLocalFile()).constData(), O_RDONLY | O_CLOEXEC);
        if (fd < 0) {
            logError(QStringLiteral("MailActivity: cannot open %1").arg(file.toLocalFile()));
            continue;
        }
        descriptors.append(QDBusUnixFileDescriptor(fd)); // keeps its own duplicate
        ::close(fd);
    }
    if (!descriptors.isEmpty())
        options.insert(QStringLiteral("attachment_fds"), QVariant::fromValue(descriptors));

    QDBusMessage call =
        QDBusMessage::createMethodCall(kService, kPath, kInterface, QStringLiteral("ComposeEmail"));
    call << QString() << options;
    QPointer<PortalRequest> pending = request;
    onReply(bus_.asyncCall(call, 30000), [pending](const QDBusMessage& reply) {
        if (reply.type() == QDBusMessage::ErrorMessage && pending) {
            logError(QStringLiteral("MailActivity: %1").arg(reply.errorMessage()));
            pending->fail();
        }
    });
}

} // namespace platform

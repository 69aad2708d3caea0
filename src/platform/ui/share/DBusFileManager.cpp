#include "DBusFileManager.h"

#include "platform/runtime/Log.h"

#include <QCoreApplication>
#include <QDBusMessage>
#include <QDBusPendingCallWatcher>

namespace platform {

DBusFileManager::DBusFileManager(QDBusConnection bus) : bus_(std::move(bus)) {}

void DBusFileManager::showItems(const QList<QUrl>& files, std::function<void(bool shown)> done) {
    if (!bus_.isConnected()) {
        done(false);
        return;
    }
    QStringList uris;
    for (const QUrl& file : files)
        uris.append(file.toString(QUrl::FullyEncoded));
    QDBusMessage call = QDBusMessage::createMethodCall(
        QStringLiteral("org.freedesktop.FileManager1"),
        QStringLiteral("/org/freedesktop/FileManager1"),
        QStringLiteral("org.freedesktop.FileManager1"), QStringLiteral("ShowItems"));
    call << uris << QString();
    auto* watcher =
        new QDBusPendingCallWatcher(bus_.asyncCall(call, 5000), QCoreApplication::instance());
    QObject::connect(
        watcher, &QDBusPendingCallWatcher::finished, watcher,
        [done = std::move(done)](QDBusPendingCallWatcher* finished) {
            finished->deleteLater();
            const QDBusMessage reply = finished->reply();
            const bool shown = reply.type() == QDBusMessage::ReplyMessage;
            if (!shown)
                logDefault(QStringLiteral("ShowInFolderActivity: %1").arg(reply.errorMessage()));
            done(shown);
        });
}

Implementation<FileManagerService::Maker>& FileManagerService::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<FileManagerService> {
        return std::make_shared<DBusFileManager>();
    });
    return chosen;
}

std::shared_ptr<FileManagerService> FileManagerService::sharedService() {
    return implementation().make();
}

} // namespace platform

// A stand-in extension for the launcher's tests: it answers a request with the
// titles of its input items as activity types and ends when dismissed or
// when the host goes away. Dismissed, it can keep working
// (--busy-after-dismiss MS: queued work that takes that long) or stop
// answering altogether (--hang-after-dismiss).

#include "platform/hosting/AuxiliaryConnection.h"
#include "platform/hosting/ExtensionEndpoint.h"
#include "platform/runtime/GlobalQueue.h"

#include <QCoreApplication>
#include <QThread>

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    const QStringList arguments = app.arguments();
    auto endpoint = platform::ExtensionEndpoint::fromEnvironment();
    if (!endpoint->hasHost())
        return 3;
    auto connection = std::make_shared<platform::AuxiliaryConnection>(
        endpoint->channel(), platform::InterfaceDescription{"Vendor", {}},
        platform::InterfaceDescription{"Host", {"extensionDidFinishWithActivityTypes:"}});

    endpoint->onRequest = [&](QList<platform::ExtensionItem> items) {
        QStringList titles;
        for (const auto& item : items)
            titles.append(item.attributedTitle);
        connection->remoteObjectProxyWithErrorHandler(nullptr)->extensionDidFinishWithActivityTypes(
            titles);
    };
    endpoint->onDismiss = [&] { app.exit(0); };
    endpoint->onHostGone = [&] { app.exit(7); };
    const int status = app.exec();
    connection->flush();

    if (arguments.contains("--hang-after-dismiss"))
        for (;;)
            QThread::sleep(60);
    if (const qsizetype at = arguments.indexOf("--busy-after-dismiss"); at >= 0)
        platform::GlobalQueue::async(
            platform::QueuePriority::Default,
            [ms = arguments.value(at + 1).toULong()] { QThread::msleep(ms); });
    endpoint->finishQueuedWork(100);
    return status;
}

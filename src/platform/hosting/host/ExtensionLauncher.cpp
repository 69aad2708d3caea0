#include "ExtensionLauncher.h"

#include "platform/hosting/HostMessages.h"
#include "platform/hosting/MessageChannel.h"

#include <QCborArray>
#include <QTimer>
#include <unistd.h>

namespace platform {
namespace {
// The descriptor the extension finds its end of the connection on.
constexpr int kChildDescriptor = 3;
} // namespace

ExtensionLauncher::ExtensionLauncher(QObject* parent) : QObject(parent) {
    connect(&process_, &QProcess::finished, this,
            [this](int exitCode, QProcess::ExitStatus status) {
                if (channel_)
                    channel_->close();
                emit extensionEnded(exitCode, status != QProcess::NormalExit || exitCode != 0);
            });
}

ExtensionLauncher::~ExtensionLauncher() {
    if (process_.state() != QProcess::NotRunning) {
        process_.kill();
        process_.waitForFinished(2000);
    }
}

bool ExtensionLauncher::start(const QString& program, const QStringList& arguments,
                              const QList<ExtensionItem>& inputItems, QString* error) {
    const auto [hostEnd, extensionEnd] = makeSocketPair();
    if (hostEnd < 0) {
        if (error)
            *error = QStringLiteral("cannot make the connection to the extension");
        return false;
    }
    channel_ = std::make_shared<MessageChannel>(hostEnd);
    channel_->onMessage = [this](const QCborMap& message) {
        if (message.value(QStringLiteral("type")).toString() != HostMessages::Invoke)
            return;
        if (message.value(QStringLiteral("selector")).toString() !=
            QLatin1String("extensionDidFinishWithActivityTypes:"))
            return;
        QStringList types;
        for (const QCborValue& type :
             message.value(QStringLiteral("arguments")).toArray().at(0).toArray())
            if (type.isString())
                types.append(type.toString());
        emit extensionDidFinishWithActivityTypes(types);
    };

    QProcessEnvironment environment = process_.processEnvironment().isEmpty()
                                          ? QProcessEnvironment::systemEnvironment()
                                          : process_.processEnvironment();
    environment.insert(QString::fromLatin1(HostMessages::HostDescriptorVariable),
                       QString::number(kChildDescriptor));
    process_.setProcessEnvironment(environment);
    const int childEnd = extensionEnd;
    // Runs in the child between fork and exec: only async-signal-safe calls.
    process_.setChildProcessModifier([childEnd] { ::dup2(childEnd, kChildDescriptor); });
    process_.setProcessChannelMode(QProcess::ForwardedChannels);
    process_.start(program, arguments);
    const bool started = process_.waitForStarted();
    ::close(extensionEnd);
    if (!started) {
        if (error)
            *error = process_.errorString();
        channel_->close();
        return false;
    }
    channel_->send(QCborMap{{QStringLiteral("type"), HostMessages::Request},
                            {QStringLiteral("inputItems"), encodeExtensionItems(inputItems)}});
    return true;
}

void ExtensionLauncher::dismiss(int graceMs) {
    if (channel_)
        channel_->send(QCborMap{{QStringLiteral("type"), HostMessages::Dismiss}});
    if (process_.state() == QProcess::NotRunning)
        return;
    QTimer::singleShot(graceMs, this, [this] {
        if (process_.state() != QProcess::NotRunning)
            process_.kill();
    });
}

bool ExtensionLauncher::isRunning() const {
    return process_.state() != QProcess::NotRunning;
}

} // namespace platform

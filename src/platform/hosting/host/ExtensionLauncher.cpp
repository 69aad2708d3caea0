#include "ExtensionLauncher.h"

#include "platform/hosting/HostMessages.h"
#include "platform/hosting/MessageChannel.h"

#include <unistd.h>

namespace platform {
namespace {
// The descriptor the extension finds its end of the connection on.
constexpr int kChildDescriptor = 3;
} // namespace

ExtensionLauncher::ExtensionLauncher(QObject* parent) : QObject(parent) {
    killTimer_.setSingleShot(true);
    connect(&killTimer_, &QTimer::timeout, this, [this] {
        if (process_.state() != QProcess::NotRunning)
            process_.kill();
    });
    connect(&process_, &QProcess::finished, this,
            [this](int exitCode, QProcess::ExitStatus status) {
                killTimer_.stop();
                if (channel_)
                    channel_->close();
                emit extensionEnded(exitCode, status != QProcess::NormalExit || exitCode != 0);
            });
}

ExtensionLauncher::~ExtensionLauncher() {
    if (channel_) {
        channel_->onMessage = nullptr;
        channel_->onClosed = nullptr;
    }
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
        // A dismissed extension that still speaks is still alive.
        if (killTimer_.isActive())
            killTimer_.start();
        if (const auto types = HostMessages::activityTypesOfReport(message))
            emit extensionDidFinishWithActivityTypes(*types);
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
    killTimer_.start(graceMs);
}

bool ExtensionLauncher::isRunning() const {
    return process_.state() != QProcess::NotRunning;
}

} // namespace platform

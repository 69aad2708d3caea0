#include "KdeConnectLink.h"

#include "platform/ui/share/ProcessRunner.h"

#include <QStandardPaths>

#include <memory>

namespace platform {

namespace {
constexpr int kTimeoutMs = 10000;

QString program() {
    return QStandardPaths::findExecutable(QStringLiteral("kdeconnect-cli"));
}

// Runs the commands one after the other, stopping at the first failure.
void runAll(const QString& cli, QList<QStringList> commands, std::function<void(bool)> done) {
    if (commands.isEmpty()) {
        done(true);
        return;
    }
    const QStringList first = commands.takeFirst();
    runProcess(cli, first, kTimeoutMs,
               [cli, commands, done = std::move(done)](int code, const QByteArray&) mutable {
                   if (code != 0) {
                       done(false);
                       return;
                   }
                   runAll(cli, std::move(commands), std::move(done));
               });
}
} // namespace

void KdeConnectLink::reachableDevices(std::function<void(QStringList deviceIds)> done) {
    const QString cli = program();
    if (cli.isEmpty()) {
        done({});
        return;
    }
    runProcess(cli, {QStringLiteral("--list-available"), QStringLiteral("--id-only")}, kTimeoutMs,
               [done = std::move(done)](int code, const QByteArray& output) {
                   QStringList ids;
                   if (code == 0)
                       for (const QByteArray& line : output.split('\n'))
                           if (!line.trimmed().isEmpty())
                               ids.append(QString::fromUtf8(line.trimmed()));
                   done(ids);
               });
}

void KdeConnectLink::share(const QString& deviceId, const QList<QUrl>& files, const QString& text,
                           std::function<void(bool sent)> done) {
    const QString cli = program();
    if (cli.isEmpty()) {
        done(false);
        return;
    }
    QList<QStringList> commands;
    for (const QUrl& file : files)
        commands.append(
            {QStringLiteral("--device"), deviceId, QStringLiteral("--share"), file.toLocalFile()});
    if (!text.isEmpty())
        commands.append(
            {QStringLiteral("--device"), deviceId, QStringLiteral("--share-text"), text});
    runAll(cli, std::move(commands), std::move(done));
}

Implementation<PhoneLink::Maker>& PhoneLink::implementation() {
    static Implementation<Maker> chosen(
        []() -> std::shared_ptr<PhoneLink> { return std::make_shared<KdeConnectLink>(); });
    return chosen;
}

std::shared_ptr<PhoneLink> PhoneLink::sharedLink() {
    return implementation().make();
}

} // namespace platform

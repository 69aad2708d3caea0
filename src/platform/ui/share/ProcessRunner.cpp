#include "ProcessRunner.h"

#include "platform/runtime/Log.h"

#include <QCoreApplication>
#include <QProcess>
#include <QTimer>

#include <memory>

namespace platform {

void runProcess(const QString& program, const QStringList& arguments, int timeoutMs,
                std::function<void(int exitCode, const QByteArray& output)> done) {
    auto* process = new QProcess(QCoreApplication::instance());
    process->setProcessChannelMode(QProcess::SeparateChannels);
    process->setStandardInputFile(QProcess::nullDevice());
    auto finish = std::make_shared<std::function<void(int)>>(
        [process, done = std::move(done)](int code) mutable {
            if (!done)
                return;
            const QByteArray output = process->readAllStandardOutput();
            const QByteArray errors = process->readAllStandardError().trimmed();
            if (code != 0 && !errors.isEmpty())
                logError(QStringLiteral("%1: %2").arg(process->program(),
                                                      QString::fromLocal8Bit(errors)));
            auto report = std::exchange(done, {});
            process->deleteLater();
            report(code, output);
        });
    QObject::connect(process, &QProcess::finished, process,
                     [process, finish](int code, QProcess::ExitStatus status) {
                         (*finish)(status == QProcess::NormalExit ? code : -1);
                     });
    QObject::connect(process, &QProcess::errorOccurred, process,
                     [process, finish](QProcess::ProcessError error) {
                         if (error == QProcess::FailedToStart) {
                             logError(QStringLiteral("%1: cannot start").arg(process->program()));
                             (*finish)(-1);
                         }
                     });
    QTimer::singleShot(timeoutMs, process, [process, finish] {
        if (process->state() != QProcess::NotRunning) {
            logError(QStringLiteral("%1: no answer in time").arg(process->program()));
            process->kill();
            (*finish)(-1);
        }
    });
    process->start(program, arguments);
}

} // namespace platform

#include "XdgEmailComposer.h"

#include "platform/runtime/Log.h"
#include "platform/ui/share/ProcessRunner.h"

#include <QStandardPaths>

namespace platform {

namespace {
constexpr int kQueryTimeoutMs = 5000;
// xdg-email returns once the mail program has the draft; some programs hand
// it to a running instance and return at once, others only when closed.
constexpr int kComposeTimeoutMs = 60000;
} // namespace

QStringList XdgEmailComposer::argumentsFor(const MailDraft& draft) {
    QStringList arguments{QStringLiteral("--utf8")};
    if (!draft.subject.isEmpty())
        arguments << QStringLiteral("--subject") << draft.subject;
    arguments << QStringLiteral("--body") << draft.body;
    for (const QUrl& file : draft.attachments)
        arguments << QStringLiteral("--attach") << file.toLocalFile();
    return arguments;
}

void XdgEmailComposer::checkAvailability(std::function<void(bool available)> done) {
    const QString email = QStandardPaths::findExecutable(QStringLiteral("xdg-email"));
    const QString mime = QStandardPaths::findExecutable(QStringLiteral("xdg-mime"));
    if (email.isEmpty() || mime.isEmpty()) {
        done(false);
        return;
    }
    runProcess(mime,
               {QStringLiteral("query"), QStringLiteral("default"),
                QStringLiteral("x-scheme-handler/mailto")},
               kQueryTimeoutMs, [done = std::move(done)](int code, const QByteArray& output) {
                   done(code == 0 && !output.trimmed().isEmpty());
               });
}

void XdgEmailComposer::compose(const MailDraft& draft, std::function<void(bool handedOver)> done) {
    const QString email = QStandardPaths::findExecutable(QStringLiteral("xdg-email"));
    if (email.isEmpty()) {
        logError(QStringLiteral("MailActivity: xdg-email is not installed"));
        done(false);
        return;
    }
    runProcess(email, argumentsFor(draft), kComposeTimeoutMs,
               [done = std::move(done)](int code, const QByteArray&) {
                   if (code == 0)
                       logDefault(QStringLiteral(
                           "MailActivity: the draft went to the mail program; whether its "
                           "composer opened cannot be known from here"));
                   else
                       logError(QStringLiteral("MailActivity: xdg-email failed (%1)").arg(code));
                   done(code == 0);
               });
}

} // namespace platform

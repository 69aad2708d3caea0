#pragma once

#include "platform/runtime/Implementation.h"

#include <QList>
#include <QString>
#include <QUrl>

#include <functional>
#include <memory>

namespace platform {

// A message for the user's mail program to open in its composer.
struct MailDraft {
    QString subject;
    QString body;
    QList<QUrl> attachments; // local files
};

// Hands a draft to the user's mail program: the XDG desktop portal's Email
// interface inside a sandbox, `xdg-email` otherwise. Main thread only; the
// callbacks run on the main thread, each exactly once.
class MailComposer {
  public:
    virtual ~MailComposer() = default;

    // Whether a mail program is there to take a draft.
    virtual void checkAvailability(std::function<void(bool available)> done) = 0;
    // `handedOver` says the mail program took the draft; neither way knows
    // whether the user then sent it.
    virtual void compose(const MailDraft& draft, std::function<void(bool handedOver)> done) = 0;

    static std::shared_ptr<MailComposer> sharedComposer();
    using Maker = std::shared_ptr<MailComposer>();
    static Implementation<Maker>& implementation();
};

} // namespace platform

#include "MailActivity.h"

#include "platform/services/ActivityTypes.h"
#include "platform/ui/share/ActivityItems.h"
#include "platform/ui/share/ShareStrings.h"

#include <QPointer>

namespace platform {

MailActivity::MailActivity() : composer_(MailComposer::sharedComposer()) {
    QPointer<MailActivity> self = this;
    composer_->checkAvailability([self](bool available) {
        if (!self)
            return;
        self->available_ = available;
        emit self->availabilityChanged();
    });
}

QString MailActivity::activityType() const {
    return MailActivityType;
}

QString MailActivity::activityTitle() const {
    return ShareStrings::text("ACTIVITY_MAIL", "Mail");
}

QImage MailActivity::activityImage() const {
    return ShareStrings::icon({QStringLiteral("mail-message-new"), QStringLiteral("mail-send"),
                               QStringLiteral("internet-mail")},
                              activityTitle(), QColor(0x1e, 0x88, 0xe5), ShareStrings::Glyph::Mail);
}

bool MailActivity::canPerformWithActivityItems(const QVariantList& items) {
    return available_ &&
           (!ActivityItems::files(items).isEmpty() || !ActivityItems::messageText(items).isEmpty());
}

MailDraft MailActivity::draftFor(const QVariantList& items) {
    MailDraft draft;
    draft.body = ActivityItems::messageText(items);
    draft.attachments = ActivityItems::files(items);
    return draft;
}

void MailActivity::prepareWithActivityItems(const QVariantList& items) {
    draft_ = draftFor(items);
}

void MailActivity::performActivity() {
    QPointer<MailActivity> self = this;
    composer_->compose(draft_, [self](bool handedOver) {
        if (self)
            self->activityDidFinish(handedOver);
    });
}

} // namespace platform

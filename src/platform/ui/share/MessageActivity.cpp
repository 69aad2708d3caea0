#include "MessageActivity.h"

#include "platform/services/ActivityTypes.h"
#include "platform/ui/share/ActivityItems.h"
#include "platform/ui/share/ShareStrings.h"

#include <QPointer>

namespace platform {

MessageActivity::MessageActivity() : link_(PhoneLink::sharedLink()) {
    QPointer<MessageActivity> self = this;
    link_->reachableDevices([self](QStringList devices) {
        if (!self)
            return;
        self->devices_ = std::move(devices);
        emit self->availabilityChanged();
    });
}

QString MessageActivity::activityType() const {
    return MessageActivityType;
}

QString MessageActivity::activityTitle() const {
    return ShareStrings::text("ACTIVITY_MESSAGE", "Send to Phone");
}

QImage MessageActivity::activityImage() const {
    return ShareStrings::icon(
        {QStringLiteral("kdeconnect"), QStringLiteral("phone"), QStringLiteral("smartphone")},
        activityTitle(), QColor(0x34, 0xc7, 0x59), ShareStrings::Glyph::Phone);
}

bool MessageActivity::canPerformWithActivityItems(const QVariantList& items) {
    return !devices_.isEmpty() &&
           (!ActivityItems::files(items).isEmpty() || !ActivityItems::messageText(items).isEmpty());
}

void MessageActivity::prepareWithActivityItems(const QVariantList& items) {
    files_ = ActivityItems::files(items);
    text_ = ActivityItems::messageText(items);
}

void MessageActivity::performActivity() {
    if (devices_.isEmpty()) {
        activityDidFinish(false);
        return;
    }
    QPointer<MessageActivity> self = this;
    link_->share(devices_.first(), files_, text_, [self](bool sent) {
        if (self)
            self->activityDidFinish(sent);
    });
}

} // namespace platform

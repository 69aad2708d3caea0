#include "PostToFacebookActivity.h"

#include "platform/services/ActivityTypes.h"
#include "platform/ui/UrlOpener.h"
#include "platform/ui/share/ActivityItems.h"
#include "platform/ui/share/ShareStrings.h"

#include <QUrlQuery>

namespace platform {

QString PostToFacebookActivity::activityType() const {
    return PostToFacebookActivityType;
}

QString PostToFacebookActivity::activityTitle() const {
    return ShareStrings::text("ACTIVITY_FACEBOOK", "Facebook");
}

QImage PostToFacebookActivity::activityImage() const {
    return ShareStrings::icon({QStringLiteral("facebook")}, activityTitle(),
                              QColor(0x18, 0x77, 0xf2), ShareStrings::Glyph::Facebook);
}

bool PostToFacebookActivity::canPerformWithActivityItems(const QVariantList& items) {
    return !ActivityItems::webLinks(items).isEmpty();
}

QUrl PostToFacebookActivity::shareDialogFor(const QUrl& link) {
    QUrl dialog(QStringLiteral("https://www.facebook.com/sharer/sharer.php"));
    QUrlQuery query;
    query.addQueryItem(QStringLiteral("u"), QString::fromLatin1(QUrl::toPercentEncoding(
                                                link.toString(QUrl::FullyEncoded))));
    dialog.setQuery(query);
    return dialog;
}

void PostToFacebookActivity::prepareWithActivityItems(const QVariantList& items) {
    const QList<QUrl> links = ActivityItems::webLinks(items);
    link_ = links.isEmpty() ? QUrl() : links.first();
}

void PostToFacebookActivity::performActivity() {
    activityDidFinish(link_.isValid() && UrlOpener::sharedOpener()->openURL(shareDialogFor(link_)));
}

} // namespace platform

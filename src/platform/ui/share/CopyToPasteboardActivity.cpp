#include "CopyToPasteboardActivity.h"

#include "platform/services/ActivityTypes.h"
#include "platform/ui/share/ActivityItems.h"
#include "platform/ui/share/ShareStrings.h"

#include <QClipboard>
#include <QGuiApplication>
#include <QMimeData>

namespace platform {

QString CopyToPasteboardActivity::activityType() const {
    return CopyToPasteboardActivityType;
}

QString CopyToPasteboardActivity::activityTitle() const {
    return ShareStrings::text("ACTIVITY_COPY", "Copy");
}

QImage CopyToPasteboardActivity::activityImage() const {
    return ShareStrings::icon({QStringLiteral("edit-copy")}, activityTitle(),
                              QColor(0x8e, 0x8e, 0x93), ShareStrings::Glyph::Copy);
}

bool CopyToPasteboardActivity::canPerformWithActivityItems(const QVariantList& items) {
    return !ActivityItems::files(items).isEmpty() || !ActivityItems::messageText(items).isEmpty();
}

QMimeData* CopyToPasteboardActivity::mimeDataFor(const QVariantList& items) {
    auto* data = new QMimeData;
    const QList<QUrl> files = ActivityItems::files(items);
    if (!files.isEmpty()) {
        data->setUrls(files); // text/uri-list
        QByteArray gnome = "copy";
        for (const QUrl& file : files)
            gnome += '\n' + file.toEncoded();
        data->setData(QStringLiteral("x-special/gnome-copied-files"), gnome);
        data->setData(QStringLiteral("application/x-kde-cutselection"), "0");
    }
    // setUrls also sets text/plain to the addresses; the texts say more.
    const QString text = ActivityItems::messageText(items);
    if (!text.isEmpty())
        data->setText(text);
    return data;
}

void CopyToPasteboardActivity::prepareWithActivityItems(const QVariantList& items) {
    items_ = items;
}

void CopyToPasteboardActivity::performActivity() {
    QGuiApplication::clipboard()->setMimeData(mimeDataFor(items_), QClipboard::Clipboard);
    activityDidFinish(true);
}

} // namespace platform

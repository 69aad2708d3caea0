#include "ShowInFolderActivity.h"

#include "platform/services/ActivityTypes.h"
#include "platform/ui/UrlOpener.h"
#include "platform/ui/share/ActivityItems.h"
#include "platform/ui/share/FileManagerService.h"
#include "platform/ui/share/ShareStrings.h"

#include <QFileInfo>
#include <QPointer>

namespace platform {

QString ShowInFolderActivity::activityType() const {
    return ShowInFolderActivityType;
}

QString ShowInFolderActivity::activityTitle() const {
    return ShareStrings::text("ACTIVITY_SHOW_IN_FOLDER", "Show in Folder");
}

QImage ShowInFolderActivity::activityImage() const {
    return ShareStrings::icon({QStringLiteral("folder-open"), QStringLiteral("folder"),
                               QStringLiteral("system-file-manager")},
                              activityTitle(), QColor(0xff, 0x95, 0x00),
                              ShareStrings::Glyph::Folder);
}

bool ShowInFolderActivity::canPerformWithActivityItems(const QVariantList& items) {
    return !ActivityItems::files(items).isEmpty();
}

void ShowInFolderActivity::prepareWithActivityItems(const QVariantList& items) {
    const QList<QUrl> files = ActivityItems::files(items);
    file_ = files.isEmpty() ? QUrl() : files.first();
}

void ShowInFolderActivity::performActivity() {
    if (!file_.isValid()) {
        activityDidFinish(false);
        return;
    }
    QPointer<ShowInFolderActivity> self = this;
    const QUrl file = file_;
    FileManagerService::sharedService()->showItems({file}, [self, file](bool shown) {
        if (!self)
            return;
        if (!shown)
            shown = UrlOpener::sharedOpener()->openURL(
                QUrl::fromLocalFile(QFileInfo(file.toLocalFile()).absolutePath()));
        self->activityDidFinish(shown);
    });
}

} // namespace platform

#include "ActivityViewController.h"

#include "platform/ui/share/ActivitySheet.h"

#include <QUrl>

namespace platform {

ActivityViewController::ActivityViewController(QVariantList activityItems,
                                               ActivityList applicationActivities)
    : items_(std::move(activityItems)), applicationActivities_(std::move(applicationActivities)) {}

Implementation<ActivityViewController::Maker>& ActivityViewController::implementation() {
    static Implementation<Maker> chosen(
        [](const QVariantList& items,
           const ActivityList& activities) -> std::shared_ptr<ActivityViewController> {
            return ActivitySheet::make(items, activities);
        });
    return chosen;
}

std::shared_ptr<ActivityViewController>
ActivityViewController::initWithActivityItems_applicationActivities(
    const QVariantList& activityItems, const ActivityList& applicationActivities) {
    return implementation().make(activityItems, applicationActivities);
}

void ActivityViewController::reportCompletion(const QString& activityType, bool completed,
                                              const QVariantList& returnedItems, ErrorPtr error) {
    if (reported_)
        return;
    reported_ = true;
    if (auto completion = std::exchange(completion_, {}))
        completion(activityType, completed, returnedItems, error);
}

QStringList ActivityViewController::describeItems(const QVariantList& items) {
    QStringList out;
    for (const QVariant& item : items) {
        if (item.typeId() == QMetaType::QUrl) {
            const QUrl url = item.toUrl();
            out.append(url.isLocalFile() ? url.toLocalFile() : url.toString());
        } else {
            out.append(item.toString());
        }
    }
    return out;
}

} // namespace platform

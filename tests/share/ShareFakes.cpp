#include "ShareFakes.h"

#include "platform/runtime/MainQueue.h"

#include <thread>

using namespace platform;

namespace testing_support {

void FakeStoreLookup::startRequest(const StoreLookupRequest& request, Callback callback) {
    {
        std::lock_guard lock(mutex_);
        requests_.append(request);
    }
    std::thread([this, callback = std::move(callback), response = response, error = error] {
        calledOnMainThread = MainQueue::isCurrent();
        callback(response, error);
    }).detach();
}

QList<StoreLookupRequest> FakeStoreLookup::requests() const {
    std::lock_guard lock(mutex_);
    return requests_;
}

QVariantMap storeItem(const QString& name, const QString& artist, const QString& link,
                      const QStringList& genres) {
    QVariantMap item;
    item.insert(StoreItemKey::displayName, name);
    if (!artist.isNull())
        item.insert(StoreItemKey::artistName, artist);
    if (!link.isNull())
        item.insert(StoreItemKey::shortProductURL, link);
    if (!genres.isEmpty())
        item.insert(StoreItemKey::genreNames, genres);
    return item;
}

std::optional<ExtensionManifest>
FakeExtensionRegistry::extensionWithIdentifier(const QString& identifier, bool excludingDisabled) {
    if (!installed.contains(identifier))
        return std::nullopt;
    ExtensionManifest manifest;
    manifest.identifier = identifier;
    manifest.enabled = installed.value(identifier);
    if (excludingDisabled && !manifest.enabled)
        return std::nullopt;
    return manifest;
}

void FakeActivity::performActivity() {
    calls.append(QStringLiteral("perform"));
    if (completesWith)
        activityDidFinish(*completesWith);
}

bool FakeActivitySheet::performActivityNamed(const QString& type) {
    finish(type, true);
    return true;
}

void FakeActivitySheet::cancel() {
    if (presentingViewController())
        dismissViewControllerAnimated_completion(false);
    reportCompletion(QString(), false);
}

void FakeActivitySheet::finish(const QString& type, bool completed) {
    if (presentingViewController())
        dismissViewControllerAnimated_completion(false);
    reportCompletion(type, completed);
}

QList<std::shared_ptr<FakeActivitySheet>>& FakeActivitySheet::made() {
    static QList<std::shared_ptr<FakeActivitySheet>> sheets;
    return sheets;
}

FakeSheets::FakeSheets()
    : replacement_(ActivityViewController::implementation().replace(
          [](const QVariantList& items, const ActivityViewController::ActivityList& activities)
              -> std::shared_ptr<ActivityViewController> {
              auto sheet = std::make_shared<FakeActivitySheet>(items, activities);
              FakeActivitySheet::made().append(sheet);
              return sheet;
          })) {
    FakeActivitySheet::made().clear();
}

FakeSheets::~FakeSheets() {
    FakeActivitySheet::made().clear();
}

std::shared_ptr<FakeActivitySheet> FakeSheets::last() const {
    return FakeActivitySheet::made().isEmpty() ? nullptr : FakeActivitySheet::made().last();
}

} // namespace testing_support

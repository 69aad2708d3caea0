#include "TXStoreManager.h"

#include "platform/runtime/MainQueue.h"
#include "platform/services/store/StoreLookup.h"
#include "support/BundleTXExtensions.h"

#include <mutex>

using namespace platform;

std::shared_ptr<TXStoreManager> TXStoreManager::sharedManager() {
    static std::once_flag once;
    static std::shared_ptr<TXStoreManager> shared;
    std::call_once(once, [] { shared.reset(new TXStoreManager); });
    return shared;
}

void TXStoreManager::loadItemDetailsForBundleIdentifier_completionHandler(
    const QString& bundleIdentifier,
    std::function<void(std::shared_ptr<TXStoreInfo>)> completionHandler) {
    // 1. The request: product details of one bundle identifier.
    StoreLookupRequest request;
    request.profile = StoreLookupRequest::Profile::ProductKey;
    request.localizationStyle = 1;
    request.parameters.insert(StoreLookupRequest::BundleIdentifiersParameter,
                              QStringList{bundleIdentifier});

    // 2. Start it; a failure takes the same path as an empty answer.
    StoreLookup::sharedLookup()->startRequest(
        request, [bundleIdentifier, completionHandler = std::move(completionHandler)](
                     const StoreLookupResponse& response, ErrorPtr) {
            const QVariantMap item =
                response.results.isEmpty() ? QVariantMap() : response.results.first().toMap();

            // 3.–8. The record.
            auto info = std::make_shared<TXStoreInfo>();
            info->itemURL = item.value(StoreItemKey::shortProductURL).toString();
            if (item.contains(StoreItemKey::displayName))
                info->appName = item.value(StoreItemKey::displayName).toString();
            else
                info->appName =
                    BundleTXExtensions::_txLocalizedAppNameFromBundleID(bundleIdentifier);
            info->author = item.value(StoreItemKey::artistName).toString();
            if (item.contains(StoreItemKey::genreNames))
                info->categories = item.value(StoreItemKey::genreNames).toStringList();
            info->bundleID = bundleIdentifier;

            // 9. Hand it over on the main queue.
            MainQueue::async([completionHandler, info] { completionHandler(info); });
        });
}

#pragma once

#include "TXStoreInfo.h"

#include <functional>
#include <memory>

// Looks up the recorded application's store details through the platform's
// store-lookup service. Has no state; one shared instance per process.
class TXStoreManager {
  public:
    // The one instance, made on the first call (any thread, once).
    static std::shared_ptr<TXStoreManager> sharedManager();

    // Starts the lookup and returns at once. `completionHandler` (required)
    // is called exactly once, on the main thread, always with a record: when
    // the store knows nothing of the application, or the lookup fails, the
    // record holds the identifier, an empty author and link, no categories
    // and the installed application's own name (or none).
    void loadItemDetailsForBundleIdentifier_completionHandler(
        const QString& bundleIdentifier,
        std::function<void(std::shared_ptr<TXStoreInfo>)> completionHandler);

  private:
    TXStoreManager() = default;
};

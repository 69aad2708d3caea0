#pragma once

#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QString>
#include <QStringList>
#include <QVariantList>
#include <QVariantMap>

#include <functional>
#include <memory>

namespace platform {

// A question to the store: which applications, and how to describe them.
struct StoreLookupRequest {
    enum class Profile { ProductKey };
    Profile profile = Profile::ProductKey;
    // How names are localised; 1 is the user's language.
    int localizationStyle = 1;
    // Parameters by name; BundleIdentifiersParameter holds a QStringList.
    QVariantMap parameters;

    static inline const QString BundleIdentifiersParameter = QStringLiteral("bundleIdentifiers");
};

// The store's answer: one item per application it knows, in the order asked.
// Each item is a QVariantMap holding the entries below that the store has.
struct StoreLookupResponse {
    QVariantList results;
};

namespace StoreItemKey {
inline const QString shortProductURL = QStringLiteral("shortProductURL"); // QString
inline const QString displayName = QStringLiteral("displayName");         // QString
inline const QString artistName = QStringLiteral("artistName");           // QString
inline const QString genreNames = QStringLiteral("genreNames");           // QStringList
} // namespace StoreItemKey

// The store-lookup service: the details of applications by their bundle
// identifiers.
//
// startRequest returns at once; callable from any thread. The callback runs
// exactly once, on a thread of the service (never the caller's stack), within
// three seconds of the start whatever the network does. A failure comes as an
// error with an empty response; an application the store does not know is
// simply missing from the results.
class StoreLookup {
  public:
    using Callback = std::function<void(const StoreLookupResponse& response, ErrorPtr error)>;

    virtual ~StoreLookup() = default;
    virtual void startRequest(const StoreLookupRequest& request, Callback callback) = 0;

    // The service from implementation(): the desktop's catalogue and the
    // remote one together, unless a test replaced it.
    static std::shared_ptr<StoreLookup> sharedLookup();
    using Maker = std::shared_ptr<StoreLookup>();
    static Implementation<Maker>& implementation();
};

} // namespace platform

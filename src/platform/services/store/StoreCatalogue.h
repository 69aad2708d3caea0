#pragma once

#include <QString>
#include <QStringList>

#include <functional>
#include <optional>

namespace platform {

// What one catalogue knows of an application.
struct StoreRecord {
    QString name;
    QString developerName; // may be empty
    QStringList categories;
    QString storeLink; // where a person can read about it and install it
};

// One source of application details (the desktop's AppStream catalogue, a
// remote catalogue). lookupApplication is called on the store service's
// thread, which runs an event loop; `done` is called exactly once, from any
// thread, with nullopt when the catalogue does not know the application or
// cannot be read. A source that never calls back is tolerated: the service
// stops waiting at its deadline.
class StoreCatalogue {
  public:
    using Done = std::function<void(std::optional<StoreRecord> record)>;

    virtual ~StoreCatalogue() = default;
    virtual void lookupApplication(const QString& bundleIdentifier, Done done) = 0;
};

} // namespace platform

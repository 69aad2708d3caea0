#pragma once

#include "platform/services/store/StoreCatalogue.h"

#include <QStringList>

#include <memory>
#include <mutex>

namespace platform {

// The desktop's own catalogue of applications, read with libappstream: the
// distribution's catalogue, installed metainfo files and Flatpak remotes'
// data. An application is found by its bundle identifier as a component id,
// then with ".desktop" added, then as the desktop-file launchable it ships;
// its store link is "appstream://<component id>", which software centres
// open.
//
// The catalogue is loaded once, on a worker thread, at the first lookup, and
// kept; lookups run on worker threads and call back there. An empty or
// missing catalogue answers nullopt. Safe to use from any thread; held by
// std::shared_ptr (a lookup keeps it alive until it has answered).
class AppStreamCatalogue final : public StoreCatalogue,
                                 public std::enable_shared_from_this<AppStreamCatalogue> {
  public:
    // `directories`: read only these (each a folder of collection XML or of
    // metainfo files) instead of the desktop's locations. Empty: the
    // directories of $TAMSEL_APPSTREAM_DIRS (colon-separated) when it is set,
    // else the desktop's own locations.
    explicit AppStreamCatalogue(QStringList directories = {});
    ~AppStreamCatalogue() override;

    void lookupApplication(const QString& bundleIdentifier, Done done) override;

    // The same lookup, blocking the calling thread (loads the catalogue on
    // first use). Not on the main thread.
    std::optional<StoreRecord> lookupNow(const QString& bundleIdentifier);

  private:
    struct Pool;
    QStringList directories_;
    std::mutex mutex_;
    std::shared_ptr<Pool> pool_; // loaded under mutex_
};

} // namespace platform

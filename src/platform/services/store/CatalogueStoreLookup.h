#pragma once

#include "platform/services/store/StoreCatalogue.h"
#include "platform/services/store/StoreLookup.h"

#include <QThread>

#include <chrono>
#include <memory>

namespace platform {

// The store-lookup service on two catalogues: the desktop's own (always
// asked) and a remote one (asked when there is one). The remote answer wins
// when it comes before the deadline; otherwise the local one is used, and an
// application neither knows is missing from the results. The callback comes
// at the deadline at the latest, whatever the catalogues do.
//
// Owns the service thread, an event loop on which the catalogues are asked
// and the callbacks run. Any thread may start requests. The catalogues are
// made on the service thread by the makers given (so a network catalogue
// lives there) and released there when the service goes.
class CatalogueStoreLookup final : public StoreLookup {
  public:
    using CatalogueMaker = std::function<std::shared_ptr<StoreCatalogue>()>;

    // `makeRemote` may be empty: no remote catalogue.
    CatalogueStoreLookup(CatalogueMaker makeLocal, CatalogueMaker makeRemote,
                         std::chrono::milliseconds deadline = std::chrono::milliseconds(2500));
    ~CatalogueStoreLookup() override;

    void startRequest(const StoreLookupRequest& request, Callback callback) override;

    // The desktop's service: AppStream, and the remote catalogue unless
    // $TAMSEL_STORE_URL is set empty.
    static std::shared_ptr<CatalogueStoreLookup> desktopLookup();

  private:
    struct Catalogues;
    struct Pending;
    void ask(const std::shared_ptr<Pending>& pending);
    void settle(const std::shared_ptr<Pending>& pending, bool deadlinePassed);

    std::chrono::milliseconds deadline_;
    QThread thread_;
    QObject* context_ = nullptr; // lives on thread_
    std::shared_ptr<Catalogues> catalogues_;
};

} // namespace platform

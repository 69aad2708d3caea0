#include "CatalogueStoreLookup.h"

#include "platform/services/store/AppStreamCatalogue.h"
#include "platform/services/store/RemoteCatalogue.h"

#include <QPointer>
#include <QTimer>

#include <optional>

namespace platform {

struct CatalogueStoreLookup::Catalogues {
    CatalogueMaker makeLocal, makeRemote;
    // Made on first use, on the service thread.
    std::shared_ptr<StoreCatalogue> local, remote;
    bool made = false;
};

// One request in flight. Touched only on the service thread.
struct CatalogueStoreLookup::Pending {
    QStringList identifiers;
    Callback callback;
    // Per identifier: not yet answered (outer nullopt), or the answer.
    QList<std::optional<std::optional<StoreRecord>>> local, remote;
    bool delivered = false;
};

CatalogueStoreLookup::CatalogueStoreLookup(CatalogueMaker makeLocal, CatalogueMaker makeRemote,
                                           std::chrono::milliseconds deadline)
    : deadline_(deadline), catalogues_(std::make_shared<Catalogues>()) {
    catalogues_->makeLocal = std::move(makeLocal);
    catalogues_->makeRemote = std::move(makeRemote);
    thread_.setObjectName(QStringLiteral("tamsel.store"));
    context_ = new QObject;
    context_->moveToThread(&thread_);
    // The catalogues go on their own thread, as the loop ends: a network
    // access must be released where it was made.
    QObject::connect(
        &thread_, &QThread::finished, context_,
        [catalogues = catalogues_] {
            catalogues->local.reset();
            catalogues->remote.reset();
        },
        Qt::DirectConnection);
    thread_.start();
}

CatalogueStoreLookup::~CatalogueStoreLookup() {
    thread_.quit();
    thread_.wait();
    delete context_;
}

std::shared_ptr<CatalogueStoreLookup> CatalogueStoreLookup::desktopLookup() {
    CatalogueMaker remote;
    if (RemoteCatalogue::isEnabled())
        remote = [] { return std::make_shared<RemoteCatalogue>(); };
    return std::make_shared<CatalogueStoreLookup>(
        [] { return std::make_shared<AppStreamCatalogue>(); }, std::move(remote));
}

void CatalogueStoreLookup::startRequest(const StoreLookupRequest& request, Callback callback) {
    auto pending = std::make_shared<Pending>();
    pending->identifiers =
        request.parameters.value(StoreLookupRequest::BundleIdentifiersParameter).toStringList();
    pending->callback = std::move(callback);
    pending->local.resize(pending->identifiers.size());
    pending->remote.resize(pending->identifiers.size());
    QMetaObject::invokeMethod(
        context_, [this, pending] { ask(pending); }, Qt::QueuedConnection);
}

void CatalogueStoreLookup::ask(const std::shared_ptr<Pending>& pending) {
    Catalogues& c = *catalogues_;
    if (!c.made) {
        c.made = true;
        c.local = c.makeLocal ? c.makeLocal() : nullptr;
        c.remote = c.makeRemote ? c.makeRemote() : nullptr;
    }
    QTimer::singleShot(deadline_, context_, [this, pending] { settle(pending, true); });

    QPointer<QObject> context = context_;
    for (int i = 0; i < pending->identifiers.size(); ++i) {
        const QString& id = pending->identifiers[i];
        // Answers may come from any thread; they are taken in on the
        // service's. One that comes after the service has gone is dropped.
        auto answer = [this, context, pending, i](bool fromRemote) {
            return [this, context, pending, i, fromRemote](std::optional<StoreRecord> record) {
                QMetaObject::invokeMethod(
                    context,
                    [this, pending, i, fromRemote, record = std::move(record)] {
                        (fromRemote ? pending->remote : pending->local)[i] = record;
                        settle(pending, false);
                    },
                    Qt::QueuedConnection);
            };
        };
        if (c.local)
            c.local->lookupApplication(id, answer(false));
        else
            pending->local[i].emplace(std::nullopt);
        if (c.remote)
            c.remote->lookupApplication(id, answer(true));
        else
            pending->remote[i].emplace(std::nullopt);
    }
    settle(pending, false);
}

void CatalogueStoreLookup::settle(const std::shared_ptr<Pending>& pending, bool deadlinePassed) {
    if (pending->delivered)
        return;
    // Each identifier is settled by a remote record, or by both answers, or
    // by the deadline.
    for (int i = 0; i < pending->identifiers.size() && !deadlinePassed; ++i) {
        const bool remoteFound = pending->remote[i] && pending->remote[i]->has_value();
        const bool bothAnswered = pending->remote[i] && pending->local[i];
        if (!remoteFound && !bothAnswered)
            return;
    }
    pending->delivered = true;

    StoreLookupResponse response;
    bool anyAnswer = pending->identifiers.isEmpty();
    for (int i = 0; i < pending->identifiers.size(); ++i) {
        std::optional<StoreRecord> record;
        if (pending->remote[i] && pending->remote[i]->has_value())
            record = **pending->remote[i];
        else if (pending->local[i] && pending->local[i]->has_value())
            record = **pending->local[i];
        // A catalogue that is not there does not count as an answer.
        anyAnswer = anyAnswer || (catalogues_->remote && pending->remote[i]) ||
                    (catalogues_->local && pending->local[i]);
        if (!record)
            continue;
        QVariantMap item;
        item.insert(StoreItemKey::displayName, record->name);
        if (!record->developerName.isEmpty())
            item.insert(StoreItemKey::artistName, record->developerName);
        if (!record->categories.isEmpty())
            item.insert(StoreItemKey::genreNames, record->categories);
        if (!record->storeLink.isEmpty())
            item.insert(StoreItemKey::shortProductURL, record->storeLink);
        response.results.append(item);
    }
    ErrorPtr error;
    if (!anyAnswer)
        error = makeError(-1, QStringLiteral("StoreLookup"),
                          QStringLiteral("no catalogue answered in time"));
    auto callback = std::move(pending->callback);
    callback(response, error);
}

Implementation<StoreLookup::Maker>& StoreLookup::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<StoreLookup> {
        static const auto desktop = CatalogueStoreLookup::desktopLookup();
        return desktop;
    });
    return chosen;
}

std::shared_ptr<StoreLookup> StoreLookup::sharedLookup() {
    return implementation().make();
}

} // namespace platform

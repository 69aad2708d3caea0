#include "RefreshTokenStore.h"

#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <qt6keychain/keychain.h>

namespace youtube_publishing {

RefreshTokenStore& RefreshTokenStore::shared() {
    static RefreshTokenStore* store = new RefreshTokenStore; // lives as long as the process
    return *store;
}

QString RefreshTokenStore::serviceName() {
    return QStringLiteral("org.tamsel.YouTubePublishing");
}

void RefreshTokenStore::fellBackToMemory(const QString& why) {
    if (memoryOnly_)
        return;
    memoryOnly_ = true;
    platform::logError(QStringLiteral("YouTube sign-in: no secret store is available (%1); the "
                                      "account is kept in memory until the editor closes")
                           .arg(why));
}

void RefreshTokenStore::load(const QString& client,
                             std::function<void(const QString& token)> handler) {
    Entry& entry = entries_[client];
    if (entry.loaded || memoryOnly_) {
        const QString token = entry.token;
        platform::MainQueue::async([handler, token] { handler(token); });
        return;
    }
    entry.waiting << std::move(handler);
    if (entry.waiting.size() > 1)
        return; // a read is on its way
    auto* job = new QKeychain::ReadPasswordJob(serviceName(), this);
    job->setKey(client);
    job->setInsecureFallback(false);
    connect(job, &QKeychain::Job::finished, this, [this, client, job] {
        Entry& entry = entries_[client];
        if (job->error() != QKeychain::NoError && job->error() != QKeychain::EntryNotFound)
            fellBackToMemory(job->errorString());
        // A token saved or erased while the read was on its way is newer.
        if (!entry.loaded) {
            entry.loaded = true;
            if (job->error() == QKeychain::NoError)
                entry.token = job->textData();
        }
        const auto waiting = std::exchange(entry.waiting, {});
        for (const auto& handler : waiting)
            handler(entry.token);
    });
    job->start();
}

void RefreshTokenStore::reset() {
    entries_.clear();
    memoryOnly_ = false;
}

void RefreshTokenStore::save(const QString& client, const QString& token) {
    Entry& entry = entries_[client];
    entry.token = token;
    entry.loaded = true;
    if (memoryOnly_)
        return;
    auto* job = new QKeychain::WritePasswordJob(serviceName(), this);
    job->setKey(client);
    job->setInsecureFallback(false);
    job->setTextData(token);
    connect(job, &QKeychain::Job::finished, this, [this, job] {
        if (job->error() != QKeychain::NoError)
            fellBackToMemory(job->errorString());
    });
    job->start();
}

void RefreshTokenStore::erase(const QString& client) {
    Entry& entry = entries_[client];
    entry.token.clear();
    entry.loaded = true;
    if (memoryOnly_)
        return;
    auto* job = new QKeychain::DeletePasswordJob(serviceName(), this);
    job->setKey(client);
    job->setInsecureFallback(false);
    job->start();
}

} // namespace youtube_publishing

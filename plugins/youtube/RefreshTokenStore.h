#pragma once

#include <QHash>
#include <QList>
#include <QObject>
#include <QString>

#include <functional>

namespace youtube_publishing {

// Where the account's refresh token lives between sessions: the desktop's
// secret store (the Secret Service, through QtKeychain), under the OAuth
// client's identifier. Where no secret store runs, or it refuses, that is
// said once in the log and the token is kept in this process's memory only,
// until the editor closes. Never in a file.
//
// One store per process (shared()). Main thread only; handlers are called
// later on the main thread.
class RefreshTokenStore : public QObject {
    Q_OBJECT
  public:
    static RefreshTokenStore& shared();

    // The token kept for `client` ("" when there is none). Asks the secret
    // store the first time, then answers from memory.
    void load(const QString& client, std::function<void(const QString& token)> handler);
    void save(const QString& client, const QString& token);
    void erase(const QString& client);

    // Forgets what is in memory; the next load asks the secret store again.
    void reset();

    // Whether the secret store has refused or was missing (the token is
    // then only in memory).
    bool isMemoryOnly() const { return memoryOnly_; }

    // The service name entries are stored under.
    static QString serviceName(); // "org.tamsel.YouTubePublishing"

  private:
    RefreshTokenStore() = default;
    void fellBackToMemory(const QString& why);

    struct Entry {
        bool loaded = false;
        QString token;
        QList<std::function<void(const QString&)>> waiting;
    };
    QHash<QString, Entry> entries_;
    bool memoryOnly_ = false;
};

} // namespace youtube_publishing

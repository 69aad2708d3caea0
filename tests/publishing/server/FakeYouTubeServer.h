#pragma once

#include <QByteArray>
#include <QList>
#include <QString>
#include <QStringList>
#include <QUrl>

#include <memory>

class QThread;

namespace testing_support {

// A local stand-in for Google's sign-in and the YouTube Data API v3, enough
// for the publishing plug-in: the OAuth 2.0 authorisation page (it answers at
// once with a redirect, as if the user had agreed), the token endpoint (codes
// with PKCE, refresh tokens), video categories, and resumable uploads, which
// it checks as strictly as the service does (chunks of whole 256 KiB units,
// ranges that follow on) and stores on disk.
//
// It listens on 127.0.0.1 only, on a thread of its own, so a test's main
// thread can wait on the client. Faults can be injected at any time; each
// fires the number of times asked, then the server behaves again.
class FakeYouTubeServer {
  public:
    static constexpr const char* clientId = "tamsel-test.apps.example";
    static constexpr const char* clientSecret = "tamsel-test-secret";
    static constexpr const char* uploadScope = "https://www.googleapis.com/auth/youtube.upload";

    struct Faults {
        int dropConnectionMidChunk = 0; // the connection closes halfway through a chunk's body
        int serviceUnavailable = 0;     // a chunk is answered 503
        int expireTokenMidUpload = 0;   // after a chunk has arrived, the token in use expires (401)
        int forgetSession = 0;          // a chunk's session is unknown (404)
        int quotaExceeded = 0;          // a new session is refused: 403 quotaExceeded
        int responseDelayMs = 0;        // every answer waits this long (a slow server)
        bool denySignIn = false;        // the user refuses on the consent page
        bool revokeRefreshTokens = false; // refresh tokens are answered 400 invalid_grant
    };

    struct Upload {
        QString videoId; // once complete
        QString title;
        QString description;
        QString categoryId;
        QString privacyStatus;
        qint64 declaredSize = 0; // X-Upload-Content-Length
        qint64 receivedSize = 0;
        QString filePath; // what arrived
        bool complete = false;
    };

    struct Counters {
        int authorizations = 0; // consent pages served
        int codeExchanges = 0;  // codes turned into tokens
        int refreshes = 0;      // refresh-token grants answered with a token
        int sessionsStarted = 0;
        int chunks = 0;        // chunk PUTs with a body
        int statusQueries = 0; // PUTs with "bytes */total"
        int categoryRequests = 0;
        int unauthorized = 0; // 401 answers
        int dropped = 0;      // connections dropped on purpose
    };

    // Uploads are stored under `storageDir`, which must exist.
    explicit FakeYouTubeServer(const QString& storageDir);
    ~FakeYouTubeServer();
    FakeYouTubeServer(const FakeYouTubeServer&) = delete;
    FakeYouTubeServer& operator=(const FakeYouTubeServer&) = delete;

    // Starts listening; false when no port could be had.
    bool start();
    QUrl baseUrl() const; // http://127.0.0.1:PORT

    void setFaults(const Faults& faults);
    Faults faults() const;
    // Whether arriving bytes are written to storage (true) or only counted
    // (for measuring throughput without filling the disk).
    void setStoresUploads(bool stores);
    // Seconds an access token lives (3600 unless changed).
    void setAccessTokenLifetime(int seconds);
    // Categories served for every region: (id, title, assignable).
    struct Category {
        QString id;
        QString title;
        bool assignable = true;
    };
    void setCategories(const QList<Category>& categories);

    QList<Upload> uploads() const;
    Counters counters() const;
    // "METHOD path-and-query [Content-Range]" of every request, in order.
    QStringList requestLog() const;
    // The query of the last consent page request (client_id, redirect_uri, scope,
    // code_challenge ...).
    QUrl lastAuthorizationRequest() const;
    // Refresh tokens handed out.
    QStringList issuedRefreshTokens() const;

    // Tokens the server accepts as if it had handed them out (for clients
    // that skip signing in).
    void addAccessToken(const QString& token, int lifetimeSeconds = 3600);
    void addRefreshToken(const QString& token);

    // The environment that points the plug-in at this server, as NAME=VALUE.
    QStringList environment() const;

  private:
    class Worker;
    struct Shared;
    std::shared_ptr<Shared> shared_;
    std::unique_ptr<QThread> thread_;
    Worker* worker_ = nullptr; // lives on thread_
};

} // namespace testing_support

#pragma once

#include <QList>
#include <QStringList>
#include <QUrl>

#include <memory>

class QThread;

namespace testing_support {

// A local stand-in for Google's sign-in and the YouTube Data API v3, enough
// for the publishing plug-in: the OAuth 2.0 consent page (it redirects at
// once, as if the user had agreed), the token endpoint (codes checked against
// their PKCE challenge, refresh tokens), video categories, and resumable
// uploads, checked as strictly as the service does (chunks of whole 256 KiB
// units, ranges that follow on).
//
// It listens on 127.0.0.1 only, on a thread of its own, so a test's main
// thread can wait on the client; every member may be called from any thread.
class FakeYouTubeServer {
  public:
    static constexpr const char* clientId = "tamsel-test.apps.example";
    static constexpr const char* clientSecret = "tamsel-test-secret";
    static constexpr const char* uploadScope = "https://www.googleapis.com/auth/youtube.upload";

    // Each count fires that many times, then the server behaves again.
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
        QString videoId, title, description, categoryId, privacyStatus;
        qint64 declaredSize = 0; // X-Upload-Content-Length
        qint64 receivedSize = 0;
        QString filePath; // what arrived
        bool complete = false;
    };

    // What the server saw.
    struct Record {
        QList<Upload> uploads;  // by session, in order
        QStringList log;        // "METHOD path?query [Content-Range]" of every request
        QUrl lastAuthorization; // the consent page's request
        QStringList refreshTokens;
        int codeExchanges = 0, refreshes = 0; // tokens handed out for codes, refresh tokens
        int sessionsStarted = 0, chunks = 0, statusQueries = 0; // "bytes */total" queries
        int unauthorized = 0, dropped = 0;                      // 401 answers, dropped connections
    };

    // Uploads are stored under `storageDir`; with an empty one, only counted.
    explicit FakeYouTubeServer(const QString& storageDir);
    ~FakeYouTubeServer();

    bool start(); // false when no port could be had
    QUrl baseUrl() const;
    // The environment that points the plug-in at this server, as NAME=VALUE.
    QStringList environment() const;

    void setFaults(const Faults& faults);
    // Tokens the server accepts as if it had handed them out.
    void addAccessToken(const QString& token);
    void addRefreshToken(const QString& token);
    Record record() const;

  private:
    class Worker;
    struct Shared;
    std::shared_ptr<Shared> shared_;
    std::unique_ptr<QThread> thread_;
    Worker* worker_ = nullptr; // lives on thread_
};

} // namespace testing_support

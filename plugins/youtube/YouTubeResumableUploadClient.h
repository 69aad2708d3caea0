#pragma once

#include "platform/publishing/YouTubeUploadClient.h"

#include <QPointer>
#include <QTimer>

#include <memory>
#include <optional>

class QFile;
class QNetworkAccessManager;
class QNetworkReply;
class QNetworkRequest;

// The upload client of the YouTube Data API v3 with the resumable protocol:
// a session is opened with the video's details, the file goes up in chunks of
// whole 256 KiB units, each answered 308 with the range the server holds.
// After a dropped connection, a timeout or a 5xx answer the client waits
// (doubling each time) and asks the server what it holds before going on; a
// 401 gets a new access token once; a session the server has forgotten (404)
// starts again from byte 0; quota and authorisation refusals fail at once.
//
// Registered with the class registry by the plug-in; main thread only (see
// platform::YouTubeUploadClient for the contract).
class YouTubeResumableUploadClient : public platform::YouTubeUploadClient {
    Q_OBJECT
  public:
    struct Policy {
        qint64 chunkSize = 16 * 1024 * 1024; // rounded down to whole 256 KiB units
        int maxAttempts = 8;                 // failures in a row without progress before giving up
        int firstRetryDelayMs = 1000;        // doubled after every failure in a row, plus jitter
        int maxRetryDelayMs = 60000;
        int transferTimeoutMs = 60000; // a request that moves no byte for this long is dropped
        int maxSessionRestarts = 3;    // sessions the server forgot, per upload
    };

    Q_INVOKABLE YouTubeResumableUploadClient();
    ~YouTubeResumableUploadClient() override;

    void setSignIn(std::shared_ptr<platform::YouTubeSignIn> signIn) override;
    void fetchCategories(const QString& regionCode, const QString& language,
                         CategoriesHandler handler) override;
    void upload(const platform::YouTubeUpload& upload, ProgressHandler progress,
                UploadHandler handler) override;
    void cancel() override;

    Policy policy() const { return policy_; }
    void setPolicy(const Policy& policy) { policy_ = policy; }

  private:
    enum class Step { StartSession, SendChunk, QueryStatus };
    struct Transfer;

    void run(Step step, bool renewToken = false);
    void send(Step step, const QString& token);
    void received(Step step, QNetworkReply* reply);
    void retryLater(Step step, const platform::ErrorPtr& why);
    void restartSession();
    void finish(const platform::YouTubeUploadResult& result, platform::ErrorPtr error);
    void reportProgress(qint64 bytes, bool complete = false);
    void requestCategories(const QString& regionCode, const QString& language,
                           CategoriesHandler handler, bool renew);
    QNetworkRequest request(const QUrl& url, const QString& token) const;
    qint64 chunkSize() const;

    QNetworkAccessManager* network_;
    std::shared_ptr<platform::YouTubeSignIn> signIn_;
    std::unique_ptr<Transfer> transfer_;
    QPointer<QNetworkReply> reply_;
    QTimer retryTimer_;
    Policy policy_;
};

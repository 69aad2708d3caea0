#include "YouTubeResumableUploadClient.h"

#include "ApiAnswer.h"
#include "YouTubeEndpoints.h"

#include "platform/publishing/PublishingError.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QNetworkAccessManager>
#include <QNetworkReply>
#include <QRandomGenerator>
#include <QUrlQuery>

using platform::ErrorPtr;
using youtube_publishing::ApiAnswer;
using youtube_publishing::Endpoints;
namespace PublishingError = platform::PublishingError;

namespace {

constexpr qint64 kChunkUnit = 256 * 1024;

} // namespace

struct YouTubeResumableUploadClient::Transfer {
    platform::YouTubeUpload upload;
    std::unique_ptr<QFile> file;
    qint64 total = 0;
    QUrl session;
    qint64 held = 0;  // bytes the server holds
    int failures = 0; // in a row, without progress
    int restarts = 0;
    bool tokenRenewed = false; // since the last answer that was not a 401
    bool cancelled = false;
    ProgressHandler progress;
    UploadHandler done;
};

YouTubeResumableUploadClient::YouTubeResumableUploadClient()
    : network_(new QNetworkAccessManager(this)) {
    retryTimer_.setSingleShot(true);
}

YouTubeResumableUploadClient::~YouTubeResumableUploadClient() {
    if (reply_)
        reply_->abort();
}

void YouTubeResumableUploadClient::setSignIn(std::shared_ptr<platform::YouTubeSignIn> signIn) {
    signIn_ = std::move(signIn);
}

QNetworkRequest YouTubeResumableUploadClient::request(const QUrl& url, const QString& token) const {
    QNetworkRequest request(url);
    request.setRawHeader("Authorization", "Bearer " + token.toLatin1());
    // A 308 is the protocol's "go on", not a redirect to follow.
    request.setAttribute(QNetworkRequest::RedirectPolicyAttribute,
                         QNetworkRequest::ManualRedirectPolicy);
    request.setTransferTimeout(policy_.transferTimeoutMs);
    return request;
}

void YouTubeResumableUploadClient::fetchCategories(const QString& regionCode,
                                                   const QString& language,
                                                   CategoriesHandler handler) {
    requestCategories(regionCode, language, std::move(handler), false);
}

void YouTubeResumableUploadClient::requestCategories(const QString& regionCode,
                                                     const QString& language,
                                                     CategoriesHandler handler, bool renew) {
    if (!signIn_) {
        platform::MainQueue::async([handler] {
            handler({}, PublishingError::make(PublishingError::NotSignedIn,
                                              QStringLiteral("Not signed in to YouTube")));
        });
        return;
    }
    QPointer<YouTubeResumableUploadClient> self(this);
    signIn_->accessToken(renew, [=](const QString& token, ErrorPtr error) {
        if (!self)
            return;
        if (error) {
            handler({}, error);
            return;
        }
        QUrl url = Endpoints::current().videoCategories;
        QUrlQuery query;
        query.addQueryItem(QStringLiteral("part"), QStringLiteral("snippet"));
        query.addQueryItem(QStringLiteral("regionCode"), regionCode);
        if (!language.isEmpty())
            query.addQueryItem(QStringLiteral("hl"), language);
        url.setQuery(query);
        QNetworkReply* reply = self->network_->get(self->request(url, token));
        connect(reply, &QNetworkReply::finished, self, [=] {
            reply->deleteLater();
            const ApiAnswer answer = ApiAnswer::of(reply);
            if (answer.kind == ApiAnswer::Kind::RenewToken && !renew) {
                self->requestCategories(regionCode, language, handler, true);
                return;
            }
            if (answer.kind != ApiAnswer::Kind::Success) {
                handler({}, answer.error);
                return;
            }
            handler(ApiAnswer::categoriesOf(answer.body), nullptr);
        });
    });
}

qint64 YouTubeResumableUploadClient::chunkSize() const {
    return std::max<qint64>(kChunkUnit, policy_.chunkSize / kChunkUnit * kChunkUnit);
}

void YouTubeResumableUploadClient::upload(const platform::YouTubeUpload& upload,
                                          ProgressHandler progress, UploadHandler handler) {
    if (transfer_) {
        platform::MainQueue::async([handler] {
            handler({}, PublishingError::make(PublishingError::BadResponse,
                                              QStringLiteral("An upload is already running")));
        });
        return;
    }
    transfer_ = std::make_unique<Transfer>();
    transfer_->upload = upload;
    transfer_->progress = std::move(progress);
    transfer_->done = std::move(handler);
    transfer_->file = std::make_unique<QFile>(upload.filePath);
    if (!transfer_->file->open(QIODevice::ReadOnly) || transfer_->file->size() == 0) {
        const QString why = transfer_->file->isOpen() ? QStringLiteral("it is empty")
                                                      : transfer_->file->errorString();
        QPointer<YouTubeResumableUploadClient> self(this);
        platform::MainQueue::async([self, why] {
            if (self)
                self->finish({}, PublishingError::make(
                                     PublishingError::MediaUnreadable,
                                     QStringLiteral("The video cannot be read: %1").arg(why)));
        });
        return;
    }
    transfer_->total = transfer_->file->size();
    run(Step::StartSession);
}

void YouTubeResumableUploadClient::cancel() {
    if (!transfer_)
        return;
    retryTimer_.stop();
    if (reply_) {
        reply_->disconnect(this);
        reply_->abort();
    }
    // The handler hears of it later, as the contract says; a transfer started
    // in between is not the one cancelled.
    Transfer* cancelled = transfer_.get();
    QPointer<YouTubeResumableUploadClient> self(this);
    platform::MainQueue::async([self, cancelled] {
        if (self && self->transfer_.get() == cancelled)
            self->finish({}, PublishingError::make(PublishingError::Cancelled,
                                                   QStringLiteral("The upload was cancelled")));
    });
    transfer_->cancelled = true;
    transfer_->progress = nullptr;
}

void YouTubeResumableUploadClient::run(Step step, bool renewToken) {
    if (!signIn_) {
        finish({}, PublishingError::make(PublishingError::NotSignedIn,
                                         QStringLiteral("Not signed in to YouTube")));
        return;
    }
    Transfer* current = transfer_.get();
    QPointer<YouTubeResumableUploadClient> self(this);
    signIn_->accessToken(renewToken, [self, current, step](const QString& token, ErrorPtr error) {
        if (!self || self->transfer_.get() != current || current->cancelled)
            return;
        if (PublishingError::is(error, PublishingError::SignInFailed)) {
            // The sign-in service could not be reached: like a dropped connection.
            self->retryLater(step, error);
            return;
        }
        if (error) {
            self->finish({}, error);
            return;
        }
        self->send(step, token);
    });
}

void YouTubeResumableUploadClient::send(Step step, const QString& token) {
    Transfer& t = *transfer_;
    QNetworkReply* reply = nullptr;
    switch (step) {
    case Step::StartSession: {
        QUrl url = Endpoints::current().uploadVideos;
        url.setQuery(QStringLiteral("uploadType=resumable&part=snippet,status"));
        QNetworkRequest start = request(url, token);
        start.setHeader(QNetworkRequest::ContentTypeHeader,
                        QByteArrayLiteral("application/json; charset=UTF-8"));
        start.setRawHeader("X-Upload-Content-Length", QByteArray::number(t.total));
        start.setRawHeader("X-Upload-Content-Type", t.upload.mimeType.toLatin1());
        QJsonObject snippet{{"title", t.upload.title}, {"description", t.upload.description}};
        if (!t.upload.categoryId.isEmpty())
            snippet.insert("categoryId", t.upload.categoryId);
        const QJsonObject video{{"snippet", snippet},
                                {"status", QJsonObject{{"privacyStatus", t.upload.privacyStatus}}}};
        reply = network_->post(start, QJsonDocument(video).toJson(QJsonDocument::Compact));
        break;
    }
    case Step::SendChunk: {
        const qint64 length = std::min(chunkSize(), t.total - t.held);
        QByteArray bytes;
        if (t.file->seek(t.held))
            bytes = t.file->read(length);
        if (bytes.size() != length) {
            finish({},
                   PublishingError::make(
                       PublishingError::MediaUnreadable,
                       QStringLiteral("The video cannot be read: %1").arg(t.file->errorString())));
            return;
        }
        QNetworkRequest chunk = request(t.session, token);
        chunk.setHeader(QNetworkRequest::ContentTypeHeader, t.upload.mimeType.toLatin1());
        chunk.setRawHeader("Content-Range", QStringLiteral("bytes %1-%2/%3")
                                                .arg(t.held)
                                                .arg(t.held + length - 1)
                                                .arg(t.total)
                                                .toLatin1());
        reply = network_->put(chunk, bytes);
        const qint64 base = t.held;
        connect(reply, &QNetworkReply::uploadProgress, this,
                [this, base](qint64 sent, qint64) { reportProgress(base + sent); });
        break;
    }
    case Step::QueryStatus: {
        QNetworkRequest query = request(t.session, token);
        query.setRawHeader("Content-Range", QStringLiteral("bytes */%1").arg(t.total).toLatin1());
        reply = network_->put(query, QByteArray());
        break;
    }
    }
    reply_ = reply;
    connect(reply, &QNetworkReply::finished, this, [this, step, reply] {
        reply->deleteLater();
        if (reply_ == reply)
            reply_ = nullptr;
        received(step, reply);
    });
}

void YouTubeResumableUploadClient::received(Step step, QNetworkReply* reply) {
    if (!transfer_ || transfer_->cancelled)
        return;
    Transfer& t = *transfer_;
    const ApiAnswer answer = ApiAnswer::of(reply);
    if (answer.kind != ApiAnswer::Kind::RenewToken)
        t.tokenRenewed = false;
    switch (answer.kind) {
    case ApiAnswer::Kind::Success:
        if (step == Step::StartSession) {
            t.session = reply->header(QNetworkRequest::LocationHeader).toUrl();
            if (!t.session.isValid() || t.session.isRelative()) {
                finish({},
                       PublishingError::make(PublishingError::BadResponse,
                                             QStringLiteral("YouTube opened no upload session")));
                return;
            }
            t.held = 0;
            t.failures = 0;
            run(Step::SendChunk);
        } else {
            const QString id = ApiAnswer::videoIdOf(answer.body);
            if (id.isEmpty()) {
                finish({},
                       PublishingError::make(PublishingError::BadResponse,
                                             QStringLiteral("YouTube's answer names no video")));
                return;
            }
            reportProgress(t.total, true);
            finish({id, Endpoints::watchURL(id)}, nullptr);
        }
        return;
    case ApiAnswer::Kind::Incomplete: {
        if (step == Step::StartSession) {
            finish({}, PublishingError::make(PublishingError::BadResponse,
                                             QStringLiteral("YouTube answered the session oddly")));
            return;
        }
        const qint64 held = ApiAnswer::heldBytesOf(reply->rawHeader("Range"));
        // Only bytes the server did not hold before are progress; an answer
        // alone is not, or a server that keeps failing would be tried for ever.
        if (held > t.held)
            t.failures = 0;
        t.held = std::min(held, t.total);
        reportProgress(t.held);
        run(Step::SendChunk);
        return;
    }
    case ApiAnswer::Kind::RenewToken:
        if (t.tokenRenewed) {
            finish({}, answer.error);
            return;
        }
        t.tokenRenewed = true;
        // Whatever the refused request carried may or may not have arrived.
        run(step == Step::SendChunk ? Step::QueryStatus : step, true);
        return;
    case ApiAnswer::Kind::SessionGone:
        if (step == Step::StartSession) {
            finish({}, answer.error);
            return;
        }
        if (++t.restarts > policy_.maxSessionRestarts) {
            finish({}, answer.error);
            return;
        }
        platform::logDefault(
            QStringLiteral("YouTube upload: the session was forgotten; starting again"));
        restartSession();
        return;
    case ApiAnswer::Kind::Retry:
        retryLater(step == Step::StartSession ? step : Step::QueryStatus, answer.error);
        return;
    case ApiAnswer::Kind::Fail:
        finish({}, answer.error);
        return;
    }
}

void YouTubeResumableUploadClient::restartSession() {
    transfer_->session.clear();
    transfer_->held = 0;
    transfer_->failures = 0;
    reportProgress(0);
    run(Step::StartSession);
}

void YouTubeResumableUploadClient::retryLater(Step step, const ErrorPtr& why) {
    Transfer& t = *transfer_;
    if (++t.failures >= policy_.maxAttempts) {
        finish({}, why);
        return;
    }
    const qint64 doubled = qint64(policy_.firstRetryDelayMs) << std::min(t.failures - 1, 16);
    const int delay = int(std::min<qint64>(doubled, policy_.maxRetryDelayMs));
    const int jitter = QRandomGenerator::global()->bounded(delay / 2 + 1);
    platform::logDefault(QStringLiteral("YouTube upload: %1; trying again in %2 ms")
                             .arg(why ? why->message() : QString())
                             .arg(delay + jitter));
    retryTimer_.disconnect();
    connect(&retryTimer_, &QTimer::timeout, this, [this, step] {
        if (transfer_ && !transfer_->cancelled)
            run(step);
    });
    retryTimer_.start(delay + jitter);
}

void YouTubeResumableUploadClient::reportProgress(qint64 bytes, bool complete) {
    if (!transfer_ || !transfer_->progress)
        return;
    const qint64 total = transfer_->total;
    // Only the server's answer with the video makes it whole.
    transfer_->progress(complete ? total : std::clamp<qint64>(bytes, 0, total - 1), total);
}

void YouTubeResumableUploadClient::finish(const platform::YouTubeUploadResult& result,
                                          ErrorPtr error) {
    if (!transfer_)
        return;
    retryTimer_.stop();
    std::unique_ptr<Transfer> done = std::move(transfer_);
    if (error)
        platform::logError(QStringLiteral("YouTube upload failed: %1").arg(error->description()));
    if (done->done)
        done->done(result, error);
}

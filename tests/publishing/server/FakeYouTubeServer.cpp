#include "FakeYouTubeServer.h"

#include <QCryptographicHash>
#include <QDateTime>
#include <QDir>
#include <QFile>
#include <QHash>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QPointer>
#include <QRandomGenerator>
#include <QRegularExpression>
#include <QSet>
#include <QTcpServer>
#include <QTcpSocket>
#include <QThread>
#include <QTimer>
#include <QUrlQuery>

#include <algorithm>
#include <mutex>

namespace testing_support {

namespace {

constexpr qint64 kChunkUnit = 256 * 1024;

QString randomToken(int length) {
    static const char alphabet[] =
        "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-_";
    QString token;
    for (int i = 0; i < length; ++i)
        token += QLatin1Char(alphabet[QRandomGenerator::global()->bounded(64)]);
    return token;
}

QByteArray jsonBody(const QJsonObject& object) {
    return QJsonDocument(object).toJson(QJsonDocument::Compact);
}

// The service's error document: {"error": {"code", "message", "errors": [{reason}]}}.
QByteArray apiError(int code, const QString& reason, const QString& message) {
    QJsonObject detail{{"domain", "youtube"}, {"reason", reason}, {"message", message}};
    return jsonBody(QJsonObject{{"error", QJsonObject{{"code", code},
                                                      {"message", message},
                                                      {"errors", QJsonArray{detail}},
                                                      {"status", reason}}}});
}

QList<FakeYouTubeServer::Category> defaultCategories() {
    return {{"1", "Film & Animation"},
            {"2", "Autos & Vehicles"},
            {"10", "Music"},
            {"15", "Pets & Animals"},
            {"17", "Sports"},
            {"18", "Short Movies", false},
            {"19", "Travel & Events"},
            {"20", "Gaming"},
            {"21", "Videoblogging", false},
            {"22", "People & Blogs"},
            {"23", "Comedy"},
            {"24", "Entertainment"},
            {"25", "News & Politics"},
            {"26", "Howto & Style"},
            {"27", "Education"},
            {"28", "Science & Technology"},
            {"29", "Nonprofits & Activism"}};
}

} // namespace

struct FakeYouTubeServer::Shared {
    mutable std::mutex mutex;
    QString storageDir;
    Faults faults;
    int tokenLifetime = 3600;
    bool storesUploads = true;
    QList<Category> categories = defaultCategories();
    QList<Upload> uploads;        // by session, in order of creation
    QHash<QString, int> sessions; // upload_id -> index in uploads
    Counters counters;
    QStringList log;
    QUrl lastAuthorization;
    // code -> (code_challenge, redirect_uri)
    QHash<QString, QPair<QString, QString>> codes;
    QHash<QString, QDateTime> accessTokens; // token -> expiry
    QStringList refreshTokens;
    quint16 port = 0;
};

// One request being read from a connection.
struct PendingRequest {
    bool headersDone = false;
    QByteArray method;
    QByteArray target;
    QHash<QByteArray, QByteArray> headers; // lower-case names
    qint64 contentLength = 0;
    QByteArray body;
    bool dropHalfway = false;
};

class FakeYouTubeServer::Worker : public QObject {
  public:
    explicit Worker(std::shared_ptr<Shared> shared) : shared_(std::move(shared)) {}

    quint16 listen() {
        server_ = new QTcpServer(this);
        if (!server_->listen(QHostAddress::LocalHost, 0))
            return 0;
        connect(server_, &QTcpServer::newConnection, this, [this] {
            while (QTcpSocket* socket = server_->nextPendingConnection())
                adopt(socket);
        });
        return server_->serverPort();
    }

  private:
    struct Response {
        int status = 200;
        QByteArray body;
        QByteArray contentType = "application/json; charset=UTF-8";
        QList<QPair<QByteArray, QByteArray>> headers;
    };

    void adopt(QTcpSocket* socket) {
        socket->setParent(this);
        socket->setSocketOption(QAbstractSocket::LowDelayOption, 1);
        requests_.insert(socket, PendingRequest{});
        connect(socket, &QTcpSocket::readyRead, this, [this, socket] { readFrom(socket); });
        connect(socket, &QTcpSocket::disconnected, this, [this, socket] {
            requests_.remove(socket);
            socket->deleteLater();
        });
    }

    void readFrom(QTcpSocket* socket) {
        if (!requests_.contains(socket))
            return;
        PendingRequest& request = requests_[socket];
        if (busy_.contains(socket))
            return; // an answer is on its way; the rest waits for it
        if (!request.headersDone) {
            buffers_[socket] += socket->readAll();
            QByteArray& buffer = buffers_[socket];
            const qsizetype end = buffer.indexOf("\r\n\r\n");
            if (end < 0)
                return;
            parseHeaders(request, buffer.left(end));
            request.body = buffer.mid(end + 4);
            buffers_.remove(socket);
            request.dropHalfway = isChunk(request) && takeFault(&Faults::dropConnectionMidChunk);
        } else {
            request.body += socket->readAll();
        }
        if (request.dropHalfway && request.body.size() >= request.contentLength / 2) {
            keepHalfAndDrop(socket, request);
            return;
        }
        if (request.body.size() < request.contentLength)
            return;
        PendingRequest whole = std::move(request);
        requests_[socket] = PendingRequest{};
        if (whole.body.size() > whole.contentLength) {
            // Pipelined bytes of the next request go back to the buffer.
            buffers_[socket] = whole.body.mid(whole.contentLength);
            whole.body.truncate(whole.contentLength);
        }
        respond(socket, handle(whole));
    }

    static void parseHeaders(PendingRequest& request, const QByteArray& head) {
        const QList<QByteArray> lines = head.split('\n');
        const QList<QByteArray> first = lines.value(0).trimmed().split(' ');
        request.method = first.value(0);
        request.target = first.value(1);
        for (qsizetype i = 1; i < lines.size(); ++i) {
            const qsizetype colon = lines[i].indexOf(':');
            if (colon > 0)
                request.headers.insert(lines[i].left(colon).trimmed().toLower(),
                                       lines[i].mid(colon + 1).trimmed());
        }
        request.contentLength = request.headers.value("content-length", "0").toLongLong();
        request.headersDone = true;
    }

    static bool isChunk(const PendingRequest& request) {
        return request.method == "PUT" && request.contentLength > 0 &&
               request.target.contains("upload_id=");
    }

    bool takeFault(int Faults::*fault) {
        std::lock_guard lock(shared_->mutex);
        if (shared_->faults.*fault <= 0)
            return false;
        --(shared_->faults.*fault);
        return true;
    }

    void note(const PendingRequest& request) {
        QString line = QString::fromLatin1(request.method + ' ' + request.target);
        if (request.headers.contains("content-range"))
            line += QLatin1Char(' ') + QString::fromLatin1(request.headers.value("content-range"));
        std::lock_guard lock(shared_->mutex);
        shared_->log << line;
    }

    // The service keeps what arrived of an interrupted chunk in whole units.
    void keepHalfAndDrop(QTcpSocket* socket, PendingRequest& request) {
        note(request);
        const QUrlQuery query(QUrl(QString::fromLatin1(request.target)));
        const QString id = query.queryItemValue(QStringLiteral("upload_id"));
        const auto range = parseRange(request.headers.value("content-range"));
        {
            std::lock_guard lock(shared_->mutex);
            ++shared_->counters.dropped;
            ++shared_->counters.chunks;
            const int index = shared_->sessions.value(id, -1);
            if (index >= 0 && range.valid && !range.query) {
                Upload& upload = shared_->uploads[index];
                const qint64 end = ((range.first + request.body.size()) / kChunkUnit) * kChunkUnit;
                if (range.first <= upload.receivedSize && end > upload.receivedSize)
                    append(upload, request.body.mid(upload.receivedSize - range.first,
                                                    end - upload.receivedSize));
            }
        }
        requests_.remove(socket);
        socket->abort();
    }

    struct Range {
        bool valid = false;
        bool query = false; // "bytes */total"
        qint64 first = 0;
        qint64 last = 0;
        qint64 total = 0;
    };

    static Range parseRange(const QByteArray& header) {
        static const QRegularExpression data(QStringLiteral("^bytes (\\d+)-(\\d+)/(\\d+)$"));
        static const QRegularExpression query(QStringLiteral("^bytes \\*/(\\d+)$"));
        Range range;
        const QString text = QString::fromLatin1(header).trimmed();
        if (auto m = data.match(text); m.hasMatch()) {
            range = {true, false, m.captured(1).toLongLong(), m.captured(2).toLongLong(),
                     m.captured(3).toLongLong()};
            range.valid = range.last >= range.first;
        } else if (auto q = query.match(text); q.hasMatch()) {
            range = {true, true, 0, 0, q.captured(1).toLongLong()};
        }
        return range;
    }

    void append(Upload& upload, const QByteArray& bytes) {
        if (!shared_->storesUploads) {
            upload.receivedSize += bytes.size();
            return;
        }
        QFile file(upload.filePath);
        if (file.open(QIODevice::Append)) {
            file.write(bytes);
            upload.receivedSize += bytes.size();
        }
    }

    void respond(QTcpSocket* socket, const Response& response) {
        int delay;
        {
            std::lock_guard lock(shared_->mutex);
            delay = shared_->faults.responseDelayMs;
            if (response.status == 401)
                ++shared_->counters.unauthorized;
        }
        QByteArray head = "HTTP/1.1 " + QByteArray::number(response.status) + ' ' +
                          reason(response.status) + "\r\n";
        head += "Content-Type: " +
                (response.contentType.isEmpty() ? QByteArray("application/json; charset=UTF-8")
                                                : response.contentType) +
                "\r\n";
        head += "Content-Length: " + QByteArray::number(response.body.size()) + "\r\n";
        for (const auto& [name, value] : response.headers)
            head += name + ": " + value + "\r\n";
        head += "\r\n";
        const QByteArray bytes = head + response.body;
        busy_.insert(socket);
        QPointer<QTcpSocket> alive(socket);
        QTimer::singleShot(delay, this, [this, alive, bytes] {
            if (!alive)
                return;
            busy_.remove(alive.data());
            alive->write(bytes);
            if (buffers_.contains(alive.data()) || alive->bytesAvailable() > 0)
                readFrom(alive.data());
        });
    }

    static QByteArray reason(int status) {
        switch (status) {
        case 200:
            return "OK";
        case 201:
            return "Created";
        case 302:
            return "Found";
        case 308:
            return "Resume Incomplete";
        case 400:
            return "Bad Request";
        case 401:
            return "Unauthorized";
        case 403:
            return "Forbidden";
        case 404:
            return "Not Found";
        case 503:
            return "Service Unavailable";
        default:
            return "Status";
        }
    }

    Response handle(const PendingRequest& request) {
        note(request);
        const QUrl url(QString::fromLatin1(request.target));
        const QString path = url.path();
        if (request.method == "GET" && path == QLatin1String("/o/oauth2/v2/auth"))
            return authorize(QUrlQuery(url));
        if (request.method == "POST" && path == QLatin1String("/token"))
            return token(QUrlQuery(QString::fromUtf8(request.body)));
        if (request.method == "GET" && path == QLatin1String("/youtube/v3/videoCategories"))
            return categories(request, QUrlQuery(url));
        if (path == QLatin1String("/upload/youtube/v3/videos")) {
            const QUrlQuery query(url);
            if (request.method == "POST" &&
                query.queryItemValue(QStringLiteral("uploadType")) == QLatin1String("resumable"))
                return startSession(request, query);
            if (request.method == "PUT" && query.hasQueryItem(QStringLiteral("upload_id")))
                return chunk(request, query.queryItemValue(QStringLiteral("upload_id")));
        }
        return {404, apiError(404, "notFound", "No such endpoint"), {}, {}};
    }

    static Response badRequest(const QString& reasonText, const QString& message) {
        return {400, apiError(400, reasonText, message), {}, {}};
    }

    Response authorize(const QUrlQuery& query) {
        std::lock_guard lock(shared_->mutex);
        ++shared_->counters.authorizations;
        QUrl recorded;
        recorded.setQuery(query);
        shared_->lastAuthorization = recorded;
        const QUrl redirect(
            query.queryItemValue(QStringLiteral("redirect_uri"), QUrl::FullyDecoded));
        const bool loopback = redirect.scheme() == QLatin1String("http") &&
                              (redirect.host() == QLatin1String("127.0.0.1") ||
                               redirect.host() == QLatin1String("::1")) &&
                              redirect.port() > 0;
        if (query.queryItemValue(QStringLiteral("client_id")) != QLatin1String(clientId) ||
            !loopback ||
            query.queryItemValue(QStringLiteral("response_type")) != QLatin1String("code") ||
            query.queryItemValue(QStringLiteral("code_challenge_method")) !=
                QLatin1String("S256") ||
            query.queryItemValue(QStringLiteral("code_challenge")).size() < 43)
            return {400, "invalid_request", "text/plain", {}};
        QUrlQuery answer;
        answer.addQueryItem(QStringLiteral("state"),
                            query.queryItemValue(QStringLiteral("state"), QUrl::FullyEncoded));
        if (shared_->faults.denySignIn) {
            answer.addQueryItem(QStringLiteral("error"), QStringLiteral("access_denied"));
        } else {
            // Google's codes hold a "/", which must survive the round trip.
            const QString code = QStringLiteral("4/") + randomToken(40);
            shared_->codes.insert(code, {query.queryItemValue(QStringLiteral("code_challenge")),
                                         redirect.toString()});
            answer.addQueryItem(QStringLiteral("code"), code);
            answer.addQueryItem(QStringLiteral("scope"),
                                query.queryItemValue(QStringLiteral("scope"), QUrl::FullyDecoded));
        }
        QUrl target = redirect;
        target.setQuery(answer.query(QUrl::FullyEncoded), QUrl::StrictMode);
        return {302, "", "text/plain", {{"Location", target.toEncoded()}}};
    }

    Response token(const QUrlQuery& form) {
        auto value = [&](const char* name) {
            return form.queryItemValue(QString::fromLatin1(name), QUrl::FullyDecoded);
        };
        auto oauthError = [](int status, const char* error, const QString& description) {
            return Response{
                status, jsonBody({{"error", error}, {"error_description", description}}), {}, {}};
        };
        std::lock_guard lock(shared_->mutex);
        if (value("client_id") != QLatin1String(clientId) ||
            value("client_secret") != QLatin1String(clientSecret))
            return oauthError(401, "invalid_client", QStringLiteral("Unknown client"));
        const QString grant = value("grant_type");
        QJsonObject answer{{"token_type", "Bearer"},
                           {"expires_in", shared_->tokenLifetime},
                           {"scope", uploadScope}};
        if (grant == QLatin1String("authorization_code")) {
            const QString code = value("code");
            if (!shared_->codes.contains(code))
                return oauthError(400, "invalid_grant", QStringLiteral("Malformed auth code."));
            const auto [challenge, redirect] = shared_->codes.take(code);
            const QByteArray verifier = value("code_verifier").toLatin1();
            const QByteArray expected =
                QCryptographicHash::hash(verifier, QCryptographicHash::Sha256)
                    .toBase64(QByteArray::Base64UrlEncoding | QByteArray::OmitTrailingEquals);
            if (verifier.size() < 43 || expected != challenge.toLatin1())
                return oauthError(400, "invalid_grant", QStringLiteral("Invalid code verifier."));
            if (value("redirect_uri") != redirect)
                return oauthError(400, "redirect_uri_mismatch", QStringLiteral("Bad redirect."));
            ++shared_->counters.codeExchanges;
            const QString refresh = QStringLiteral("1//") + randomToken(30);
            shared_->refreshTokens << refresh;
            answer.insert("refresh_token", refresh);
        } else if (grant == QLatin1String("refresh_token")) {
            if (shared_->faults.revokeRefreshTokens ||
                !shared_->refreshTokens.contains(value("refresh_token")))
                return oauthError(400, "invalid_grant",
                                  QStringLiteral("Token has been expired or revoked."));
            ++shared_->counters.refreshes;
        } else {
            return oauthError(400, "unsupported_grant_type", grant);
        }
        const QString access = QStringLiteral("ya29.") + randomToken(40);
        shared_->accessTokens.insert(
            access, QDateTime::currentDateTimeUtc().addSecs(shared_->tokenLifetime));
        answer.insert("access_token", access);
        return {200, jsonBody(answer), {}, {}};
    }

    // The bearer token of the request when it is valid; empty otherwise.
    QString bearer(const PendingRequest& request) {
        const QByteArray header = request.headers.value("authorization");
        if (!header.startsWith("Bearer "))
            return {};
        const QString token = QString::fromLatin1(header.mid(7));
        std::lock_guard lock(shared_->mutex);
        const QDateTime expiry = shared_->accessTokens.value(token);
        return expiry.isValid() && expiry > QDateTime::currentDateTimeUtc() ? token : QString();
    }

    static Response unauthorized() {
        return {401,
                apiError(401, "authError", "Request had invalid authentication credentials."),
                {},
                {{"WWW-Authenticate", "Bearer realm=\"https://accounts.google.com/\""}}};
    }

    Response categories(const PendingRequest& request, const QUrlQuery& query) {
        if (bearer(request).isEmpty())
            return unauthorized();
        std::lock_guard lock(shared_->mutex);
        ++shared_->counters.categoryRequests;
        QJsonArray items;
        for (const Category& category : shared_->categories)
            items.append(
                QJsonObject{{"kind", "youtube#videoCategory"},
                            {"id", category.id},
                            {"snippet", QJsonObject{{"title", category.title},
                                                    {"assignable", category.assignable},
                                                    {"channelId", "UCBR8-60-B28hp2BmDPdntcQ"}}}});
        return {200,
                jsonBody({{"kind", "youtube#videoCategoryListResponse"}, {"items", items}}),
                {},
                {}};
    }

    Response startSession(const PendingRequest& request, const QUrlQuery& query) {
        if (bearer(request).isEmpty())
            return unauthorized();
        if (takeFault(&Faults::quotaExceeded))
            return {403,
                    apiError(403, "quotaExceeded",
                             "The request cannot be completed because you have exceeded your "
                             "quota."),
                    {},
                    {}};
        const QJsonObject video = QJsonDocument::fromJson(request.body).object();
        const QJsonObject snippet = video.value("snippet").toObject();
        Upload upload;
        upload.title = snippet.value("title").toString();
        upload.description = snippet.value("description").toString();
        upload.categoryId = snippet.value("categoryId").toString();
        upload.privacyStatus = video.value("status").toObject().value("privacyStatus").toString();
        upload.declaredSize = request.headers.value("x-upload-content-length", "-1").toLongLong();
        if (!query.queryItemValue(QStringLiteral("part")).contains(QLatin1String("snippet")))
            return badRequest("invalidPart", "part must name snippet");
        if (upload.title.isEmpty() || upload.title.toStdU32String().size() > 100 ||
            upload.title.contains(QLatin1Char('<')) || upload.title.contains(QLatin1Char('>')))
            return badRequest("invalidTitle", "The request metadata specifies an invalid title.");
        if (upload.description.toUtf8().size() > 5000 ||
            upload.description.contains(QLatin1Char('<')) ||
            upload.description.contains(QLatin1Char('>')))
            return badRequest("invalidDescription",
                              "The request metadata specifies an invalid description.");
        if (upload.declaredSize <= 0)
            return badRequest("badContent", "X-Upload-Content-Length is required");
        std::lock_guard lock(shared_->mutex);
        if (!upload.categoryId.isEmpty()) {
            const bool known = std::any_of(
                shared_->categories.begin(), shared_->categories.end(),
                [&](const Category& c) { return c.id == upload.categoryId && c.assignable; });
            if (!known)
                return {400, apiError(400, "invalidCategoryId", "Invalid category."), {}, {}};
        }
        ++shared_->counters.sessionsStarted;
        const QString id = randomToken(24);
        upload.filePath = QDir(shared_->storageDir).filePath(id + QStringLiteral(".bin"));
        if (shared_->storesUploads)
            QFile(upload.filePath).open(QIODevice::WriteOnly);
        shared_->sessions.insert(id, int(shared_->uploads.size()));
        shared_->uploads << upload;
        const QByteArray location =
            QStringLiteral("http://127.0.0.1:%1/upload/youtube/v3/videos?uploadType=resumable&"
                           "upload_id=%2")
                .arg(shared_->port)
                .arg(id)
                .toLatin1();
        return {200, "", "text/plain", {{"Location", location}}};
    }

    Response chunk(const PendingRequest& request, const QString& id) {
        const Range range = parseRange(request.headers.value("content-range"));
        int index;
        {
            std::lock_guard lock(shared_->mutex);
            if (range.query)
                ++shared_->counters.statusQueries;
            else
                ++shared_->counters.chunks;
            index = shared_->sessions.value(id, -1);
        }
        if (index >= 0 && !range.query && takeFault(&Faults::forgetSession)) {
            std::lock_guard lock(shared_->mutex);
            shared_->sessions.remove(id);
            index = -1;
        }
        if (index < 0)
            return {404, apiError(404, "notFound", "Upload session not found."), {}, {}};
        const QString token = bearer(request);
        if (token.isEmpty())
            return unauthorized();
        std::lock_guard lock(shared_->mutex);
        Upload& upload = shared_->uploads[index];
        if (!range.query && upload.receivedSize > 0 && shared_->faults.expireTokenMidUpload > 0) {
            --shared_->faults.expireTokenMidUpload;
            shared_->accessTokens.remove(token);
            return unauthorized();
        }
        if (!range.query && shared_->faults.serviceUnavailable > 0) {
            --shared_->faults.serviceUnavailable;
            return {503, apiError(503, "backendError", "Backend Error"), {}, {}};
        }
        if (!range.valid || range.total != upload.declaredSize)
            return badRequest("badContent", "Bad Content-Range");
        if (!range.query) {
            const qint64 length = range.last - range.first + 1;
            if (length != request.body.size())
                return badRequest("badContent", "Content-Range does not match the body");
            if (range.last + 1 < range.total && length % kChunkUnit != 0)
                return badRequest("badContent", "Chunks must be multiples of 256 KiB");
            if (range.first > upload.receivedSize)
                return badRequest("badContent", "The range leaves a gap");
            if (range.last + 1 > upload.receivedSize)
                append(upload, request.body.mid(upload.receivedSize - range.first));
        }
        if (upload.receivedSize == upload.declaredSize) {
            if (upload.videoId.isEmpty())
                upload.videoId = randomToken(11);
            upload.complete = true;
            return {200, videoResource(upload), {}, {}};
        }
        Response incomplete{308, "", "text/plain", {}};
        if (upload.receivedSize > 0)
            incomplete.headers << qMakePair(
                QByteArray("Range"), "bytes=0-" + QByteArray::number(upload.receivedSize - 1));
        return incomplete;
    }

    static QByteArray videoResource(const Upload& upload) {
        return jsonBody({{"kind", "youtube#video"},
                         {"id", upload.videoId},
                         {"snippet", QJsonObject{{"title", upload.title},
                                                 {"description", upload.description},
                                                 {"categoryId", upload.categoryId}}},
                         {"status", QJsonObject{{"uploadStatus", "uploaded"},
                                                {"privacyStatus", upload.privacyStatus}}}});
    }

    std::shared_ptr<Shared> shared_;
    QTcpServer* server_ = nullptr;
    QHash<QTcpSocket*, PendingRequest> requests_;
    QHash<QTcpSocket*, QByteArray> buffers_;
    QSet<QTcpSocket*> busy_;
};

FakeYouTubeServer::FakeYouTubeServer(const QString& storageDir)
    : shared_(std::make_shared<Shared>()) {
    shared_->storageDir = storageDir;
}

FakeYouTubeServer::~FakeYouTubeServer() {
    if (!thread_)
        return;
    QMetaObject::invokeMethod(
        worker_, [worker = worker_] { delete worker; }, Qt::BlockingQueuedConnection);
    thread_->quit();
    thread_->wait();
}

bool FakeYouTubeServer::start() {
    thread_ = std::make_unique<QThread>();
    thread_->setObjectName(QStringLiteral("FakeYouTubeServer"));
    worker_ = new Worker(shared_);
    worker_->moveToThread(thread_.get());
    thread_->start();
    quint16 port = 0;
    QMetaObject::invokeMethod(
        worker_, [&] { port = worker_->listen(); }, Qt::BlockingQueuedConnection);
    std::lock_guard lock(shared_->mutex);
    shared_->port = port;
    return port != 0;
}

QUrl FakeYouTubeServer::baseUrl() const {
    std::lock_guard lock(shared_->mutex);
    return QUrl(QStringLiteral("http://127.0.0.1:%1").arg(shared_->port));
}

void FakeYouTubeServer::setFaults(const Faults& faults) {
    std::lock_guard lock(shared_->mutex);
    shared_->faults = faults;
}

FakeYouTubeServer::Faults FakeYouTubeServer::faults() const {
    std::lock_guard lock(shared_->mutex);
    return shared_->faults;
}

void FakeYouTubeServer::setStoresUploads(bool stores) {
    std::lock_guard lock(shared_->mutex);
    shared_->storesUploads = stores;
}

void FakeYouTubeServer::setAccessTokenLifetime(int seconds) {
    std::lock_guard lock(shared_->mutex);
    shared_->tokenLifetime = seconds;
}

void FakeYouTubeServer::setCategories(const QList<Category>& categories) {
    std::lock_guard lock(shared_->mutex);
    shared_->categories = categories;
}

QList<FakeYouTubeServer::Upload> FakeYouTubeServer::uploads() const {
    std::lock_guard lock(shared_->mutex);
    return shared_->uploads;
}

FakeYouTubeServer::Counters FakeYouTubeServer::counters() const {
    std::lock_guard lock(shared_->mutex);
    return shared_->counters;
}

QStringList FakeYouTubeServer::requestLog() const {
    std::lock_guard lock(shared_->mutex);
    return shared_->log;
}

QUrl FakeYouTubeServer::lastAuthorizationRequest() const {
    std::lock_guard lock(shared_->mutex);
    return shared_->lastAuthorization;
}

QStringList FakeYouTubeServer::issuedRefreshTokens() const {
    std::lock_guard lock(shared_->mutex);
    return shared_->refreshTokens;
}

void FakeYouTubeServer::addAccessToken(const QString& token, int lifetimeSeconds) {
    std::lock_guard lock(shared_->mutex);
    shared_->accessTokens.insert(token, QDateTime::currentDateTimeUtc().addSecs(lifetimeSeconds));
}

void FakeYouTubeServer::addRefreshToken(const QString& token) {
    std::lock_guard lock(shared_->mutex);
    shared_->refreshTokens << token;
}

QStringList FakeYouTubeServer::environment() const {
    const QString base = baseUrl().toString();
    return {QStringLiteral("TAMSEL_YOUTUBE_SIGNIN_URL=") + base,
            QStringLiteral("TAMSEL_YOUTUBE_API_URL=") + base,
            QStringLiteral("TAMSEL_YOUTUBE_CLIENT_ID=") + QLatin1String(clientId),
            QStringLiteral("TAMSEL_YOUTUBE_CLIENT_SECRET=") + QLatin1String(clientSecret)};
}

} // namespace testing_support

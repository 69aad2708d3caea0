#include "FakeYouTubeServer.h"

#include <QCryptographicHash>
#include <QDir>
#include <QFile>
#include <QHash>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QRandomGenerator>
#include <QRegularExpression>
#include <QSet>
#include <QTcpServer>
#include <QTcpSocket>
#include <QThread>
#include <QTimer>
#include <QUrlQuery>

#include <mutex>
#include <optional>

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

QByteArray json(const QJsonObject& object) {
    return QJsonDocument(object).toJson(QJsonDocument::Compact);
}

struct Response {
    int status;
    QByteArray body;
    QList<QPair<QByteArray, QByteArray>> headers = {};
};

// The service's error document: {"error": {"code", "message", "errors": [{reason}]}}.
Response apiError(int status, const QString& reason, const QString& message) {
    return {
        status,
        json({{"error", QJsonObject{{"code", status},
                                    {"message", message},
                                    {"errors", QJsonArray{QJsonObject{{"reason", reason},
                                                                      {"message", message}}}}}}})};
}

Response oauthError(int status, const char* error) {
    return {status, json({{"error", error}, {"error_description", error}})};
}

const Response kUnauthorized = {
    401,
    apiError(401, "authError", "Request had invalid authentication credentials.").body,
    {{"WWW-Authenticate", "Bearer"}}};

struct Request {
    QByteArray method, target;
    QHash<QByteArray, QByteArray> headers; // lower-case names
    qint64 contentLength = 0;
    QByteArray body;
    bool dropHalfway = false;
    QString query(const char* name) const {
        return QUrlQuery(QUrl(QString::fromLatin1(target)))
            .queryItemValue(QString::fromLatin1(name), QUrl::FullyDecoded);
    }
};

// A Content-Range: "bytes first-last/total", or "bytes */total" (a query).
struct Range {
    bool valid = false, query = false;
    qint64 first = 0, last = 0, total = 0;
};

Range parseRange(const QByteArray& header) {
    static const QRegularExpression pattern(QStringLiteral("^bytes (?:(\\d+)-(\\d+)|\\*)/(\\d+)$"));
    const auto m = pattern.match(QString::fromLatin1(header).trimmed());
    if (!m.hasMatch())
        return {};
    const bool query = m.captured(1).isEmpty();
    Range range{true, query, m.captured(1).toLongLong(), m.captured(2).toLongLong(),
                m.captured(3).toLongLong()};
    range.valid = query || range.last >= range.first;
    return range;
}

} // namespace

struct FakeYouTubeServer::Shared {
    mutable std::mutex mutex;
    QString storageDir;
    Faults faults;
    Record record;
    QHash<QString, int> sessions;                  // upload_id -> index in uploads
    QHash<QString, QPair<QString, QString>> codes; // code -> (challenge, redirect_uri)
    QSet<QString> accessTokens;
    quint16 port = 0;

    bool take(int Faults::*fault) {
        if (faults.*fault <= 0)
            return false;
        --(faults.*fault);
        return true;
    }
    void append(Upload& upload, const QByteArray& bytes) {
        QFile file(upload.filePath);
        if (storageDir.isEmpty() || (file.open(QIODevice::Append) && file.write(bytes) >= 0))
            upload.receivedSize += bytes.size();
    }
};

// Serves the connections on the server's thread, one request at a time on
// each (clients that pipeline requests are not served).
class FakeYouTubeServer::Worker : public QObject {
  public:
    explicit Worker(std::shared_ptr<Shared> shared) : s_(std::move(shared)) {}

    quint16 listen() {
        if (!server_.listen(QHostAddress::LocalHost, 0))
            return 0;
        connect(&server_, &QTcpServer::newConnection, this, [this] {
            while (QTcpSocket* socket = server_.nextPendingConnection()) {
                socket->setParent(this);
                connections_.insert(socket, {});
                connect(socket, &QTcpSocket::readyRead, this, [this, socket] { read(socket); });
                connect(socket, &QTcpSocket::disconnected, this, [this, socket] {
                    connections_.remove(socket);
                    socket->deleteLater();
                });
            }
        });
        return server_.serverPort();
    }

  private:
    struct Connection {
        QByteArray buffer;
        std::optional<Request> request; // its headers read
    };

    void read(QTcpSocket* socket) {
        if (!connections_.contains(socket))
            return;
        Connection& c = connections_[socket];
        c.buffer += socket->readAll();
        if (!c.request) {
            const qsizetype end = c.buffer.indexOf("\r\n\r\n");
            if (end < 0)
                return;
            c.request = parseHead(c.buffer.left(end));
            c.buffer.remove(0, end + 4);
            std::lock_guard lock(s_->mutex);
            c.request->dropHalfway = c.request->method == "PUT" && c.request->contentLength > 0 &&
                                     s_->take(&Faults::dropConnectionMidChunk);
        }
        if (c.request->dropHalfway && c.buffer.size() >= c.request->contentLength / 2) {
            c.request->body = c.buffer;
            keepWholeUnitsAndDrop(*c.request);
            connections_.remove(socket);
            socket->abort();
            return;
        }
        if (c.buffer.size() < c.request->contentLength)
            return;
        Request request = *std::exchange(c.request, std::nullopt);
        request.body = c.buffer.left(request.contentLength);
        c.buffer.remove(0, request.contentLength);
        answer(socket, handle(request));
    }

    static Request parseHead(const QByteArray& head) {
        const QList<QByteArray> lines = head.split('\n');
        const QList<QByteArray> first = lines.value(0).trimmed().split(' ');
        Request request;
        request.method = first.value(0);
        request.target = first.value(1);
        for (const QByteArray& line : lines.mid(1))
            if (const qsizetype colon = line.indexOf(':'); colon > 0)
                request.headers.insert(line.left(colon).trimmed().toLower(),
                                       line.mid(colon + 1).trimmed());
        request.contentLength = request.headers.value("content-length", "0").toLongLong();
        return request;
    }

    void note(const Request& request) {
        const QByteArray range = request.headers.value("content-range");
        std::lock_guard lock(s_->mutex);
        s_->record.log << QString::fromLatin1(request.method + ' ' + request.target +
                                              (range.isEmpty() ? "" : ' ' + range));
    }

    // The service keeps what arrived of an interrupted chunk, in whole units.
    void keepWholeUnitsAndDrop(const Request& request) {
        note(request);
        const Range range = parseRange(request.headers.value("content-range"));
        std::lock_guard lock(s_->mutex);
        ++s_->record.dropped;
        ++s_->record.chunks;
        const int index = s_->sessions.value(request.query("upload_id"), -1);
        if (index < 0 || !range.valid || range.query)
            return;
        Upload& upload = s_->record.uploads[index];
        const qint64 end = (range.first + request.body.size()) / kChunkUnit * kChunkUnit;
        if (range.first <= upload.receivedSize && end > upload.receivedSize)
            s_->append(upload, request.body.mid(upload.receivedSize - range.first,
                                                end - upload.receivedSize));
    }

    void answer(QTcpSocket* socket, const Response& response) {
        QByteArray bytes =
            "HTTP/1.1 " + QByteArray::number(response.status) +
            (response.status == 200 ? " OK" : " Status") + "\r\nContent-Type: " +
            (response.body.startsWith('{') ? "application/json; charset=UTF-8" : "text/plain") +
            "\r\nContent-Length: " + QByteArray::number(response.body.size()) + "\r\n";
        for (const auto& [name, value] : response.headers)
            bytes += name + ": " + value + "\r\n";
        bytes += "\r\n" + response.body;
        int delay;
        {
            std::lock_guard lock(s_->mutex);
            delay = s_->faults.responseDelayMs;
            s_->record.unauthorized += response.status == 401;
        }
        QTimer::singleShot(delay, socket, [socket, bytes] { socket->write(bytes); });
    }

    Response handle(const Request& request) {
        note(request);
        const QString path = QUrl(QString::fromLatin1(request.target)).path();
        if (request.method == "GET" && path == QLatin1String("/o/oauth2/v2/auth"))
            return authorize(request);
        if (request.method == "POST" && path == QLatin1String("/token"))
            return token(QUrlQuery(QString::fromUtf8(request.body)));
        if (request.method == "GET" && path == QLatin1String("/youtube/v3/videoCategories"))
            return categories(request);
        if (path == QLatin1String("/upload/youtube/v3/videos")) {
            if (request.method == "POST" && request.query("uploadType") == "resumable")
                return startSession(request);
            if (request.method == "PUT" && !request.query("upload_id").isEmpty())
                return chunk(request);
        }
        return apiError(404, "notFound", "No such endpoint");
    }

    Response authorize(const Request& request) {
        // The tests check the rest of the request; the token endpoint checks
        // the challenge against its verifier.
        const QUrl redirect(request.query("redirect_uri"));
        if (request.query("client_id") != QLatin1String(clientId))
            return {400, "invalid_request"};
        std::lock_guard lock(s_->mutex);
        s_->record.lastAuthorization = QUrl(QString::fromLatin1(request.target));
        QUrlQuery answer;
        answer.addQueryItem(QStringLiteral("state"), request.query("state"));
        if (s_->faults.denySignIn) {
            answer.addQueryItem(QStringLiteral("error"), QStringLiteral("access_denied"));
        } else {
            // Google's codes hold a "/", which must survive the round trip.
            const QString code = QStringLiteral("4/") + randomToken(40);
            s_->codes.insert(code, {request.query("code_challenge"), redirect.toString()});
            answer.addQueryItem(QStringLiteral("code"), code);
            answer.addQueryItem(QStringLiteral("scope"), request.query("scope"));
        }
        QUrl target = redirect;
        target.setQuery(answer);
        return {302, "", {{"Location", target.toEncoded()}}};
    }

    Response token(const QUrlQuery& form) {
        auto value = [&](const char* name) {
            return form.queryItemValue(QString::fromLatin1(name), QUrl::FullyDecoded);
        };
        std::lock_guard lock(s_->mutex);
        if (value("client_id") != QLatin1String(clientId) ||
            value("client_secret") != QLatin1String(clientSecret))
            return oauthError(401, "invalid_client");
        QJsonObject answer{{"token_type", "Bearer"}, {"expires_in", 3600}, {"scope", uploadScope}};
        if (value("grant_type") == QLatin1String("authorization_code")) {
            if (!s_->codes.contains(value("code")))
                return oauthError(400, "invalid_grant");
            const auto [challenge, redirect] = s_->codes.take(value("code"));
            const QByteArray verifier = value("code_verifier").toLatin1();
            if (verifier.size() < 43 ||
                QCryptographicHash::hash(verifier, QCryptographicHash::Sha256)
                        .toBase64(QByteArray::Base64UrlEncoding | QByteArray::OmitTrailingEquals) !=
                    challenge.toLatin1() ||
                value("redirect_uri") != redirect)
                return oauthError(400, "invalid_grant");
            ++s_->record.codeExchanges;
            const QString refresh = QStringLiteral("1//") + randomToken(30);
            s_->record.refreshTokens << refresh;
            answer.insert("refresh_token", refresh);
        } else if (value("grant_type") == QLatin1String("refresh_token")) {
            if (s_->faults.revokeRefreshTokens ||
                !s_->record.refreshTokens.contains(value("refresh_token")))
                return oauthError(400, "invalid_grant");
            ++s_->record.refreshes;
        } else {
            return oauthError(400, "unsupported_grant_type");
        }
        const QString access = QStringLiteral("ya29.") + randomToken(40);
        s_->accessTokens.insert(access);
        answer.insert("access_token", access);
        return {200, json(answer)};
    }

    // The request's bearer token when the server knows it; empty otherwise.
    QString bearer(const Request& request) {
        const QString token = QString::fromLatin1(request.headers.value("authorization"))
                                  .remove(QRegularExpression(QStringLiteral("^Bearer ")));
        std::lock_guard lock(s_->mutex);
        return s_->accessTokens.contains(token) ? token : QString();
    }

    Response categories(const Request& request) {
        if (bearer(request).isEmpty())
            return kUnauthorized;
        QJsonArray items;
        for (const auto& [id, title, assignable] : kCategories)
            items.append(QJsonObject{
                {"id", id},
                {"snippet", QJsonObject{{"title", title}, {"assignable", assignable}}}});
        return {200, json({{"kind", "youtube#videoCategoryListResponse"}, {"items", items}})};
    }

    Response startSession(const Request& request) {
        if (bearer(request).isEmpty())
            return kUnauthorized;
        const QJsonObject video = QJsonDocument::fromJson(request.body).object();
        const QJsonObject snippet = video.value("snippet").toObject();
        Upload upload;
        upload.title = snippet.value("title").toString();
        upload.description = snippet.value("description").toString();
        upload.categoryId = snippet.value("categoryId").toString();
        upload.privacyStatus = video.value("status").toObject().value("privacyStatus").toString();
        upload.declaredSize = request.headers.value("x-upload-content-length", "-1").toLongLong();
        // The fitting of the text to the service's limits is tested on its own.
        if (!request.query("part").contains(QLatin1String("snippet")) || upload.title.isEmpty() ||
            upload.declaredSize <= 0)
            return apiError(400, "invalidMetadata", "The request metadata is invalid.");
        std::lock_guard lock(s_->mutex);
        if (s_->take(&Faults::quotaExceeded))
            return apiError(403, "quotaExceeded", "You have exceeded your quota.");
        ++s_->record.sessionsStarted;
        const QString id = randomToken(24);
        if (!s_->storageDir.isEmpty()) {
            upload.filePath = QDir(s_->storageDir).filePath(id + QStringLiteral(".bin"));
            QFile(upload.filePath).open(QIODevice::WriteOnly);
        }
        s_->sessions.insert(id, int(s_->record.uploads.size()));
        s_->record.uploads << upload;
        return {200,
                "",
                {{"Location", QStringLiteral("http://127.0.0.1:%1/upload/youtube/v3/videos?"
                                             "uploadType=resumable&upload_id=%2")
                                  .arg(s_->port)
                                  .arg(id)
                                  .toLatin1()}}};
    }

    Response chunk(const Request& request) {
        const Range range = parseRange(request.headers.value("content-range"));
        const QString token = bearer(request);
        std::lock_guard lock(s_->mutex);
        ++(range.query ? s_->record.statusQueries : s_->record.chunks);
        const QString id = request.query("upload_id");
        if (!range.query && s_->sessions.contains(id) && s_->take(&Faults::forgetSession))
            s_->sessions.remove(id);
        if (!s_->sessions.contains(id))
            return apiError(404, "notFound", "Upload session not found.");
        if (token.isEmpty())
            return kUnauthorized;
        Upload& upload = s_->record.uploads[s_->sessions.value(id)];
        if (!range.query && upload.receivedSize > 0 && s_->take(&Faults::expireTokenMidUpload)) {
            s_->accessTokens.remove(token);
            return kUnauthorized;
        }
        if (!range.query && s_->take(&Faults::serviceUnavailable))
            return apiError(503, "backendError", "Backend Error");
        if (!range.valid || range.total != upload.declaredSize)
            return apiError(400, "badContent", "Bad Content-Range");
        if (!range.query) {
            const qint64 length = range.last - range.first + 1;
            if (length != request.body.size() || range.first > upload.receivedSize ||
                (range.last + 1 < range.total && length % kChunkUnit != 0))
                return apiError(400, "badContent", "Not the body, a gap, or not whole units");
            if (range.last + 1 > upload.receivedSize)
                s_->append(upload, request.body.mid(upload.receivedSize - range.first));
        }
        if (upload.receivedSize == upload.declaredSize) {
            if (upload.videoId.isEmpty())
                upload.videoId = randomToken(11);
            upload.complete = true;
            return {200, json({{"kind", "youtube#video"},
                               {"id", upload.videoId},
                               {"snippet", QJsonObject{{"title", upload.title}}},
                               {"status", QJsonObject{{"uploadStatus", "uploaded"}}}})};
        }
        if (upload.receivedSize == 0)
            return {308, ""};
        return {308, "", {{"Range", "bytes=0-" + QByteArray::number(upload.receivedSize - 1)}}};
    }

    struct Category {
        const char* id;
        const char* title;
        bool assignable;
    };
    static constexpr Category kCategories[] = {
        {"1", "Film & Animation", true}, {"10", "Music", true},
        {"18", "Short Movies", false},   {"20", "Gaming", true},
        {"22", "People & Blogs", true},  {"23", "Comedy", true}};

    std::shared_ptr<Shared> s_;
    QTcpServer server_{this}; // a child, so it moves to the server thread with the worker
    QHash<QTcpSocket*, Connection> connections_;
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

QStringList FakeYouTubeServer::environment() const {
    const QString base = baseUrl().toString();
    return {QStringLiteral("TAMSEL_YOUTUBE_SIGNIN_URL=") + base,
            QStringLiteral("TAMSEL_YOUTUBE_API_URL=") + base,
            QStringLiteral("TAMSEL_YOUTUBE_CLIENT_ID=") + QLatin1String(clientId),
            QStringLiteral("TAMSEL_YOUTUBE_CLIENT_SECRET=") + QLatin1String(clientSecret)};
}

void FakeYouTubeServer::setFaults(const Faults& faults) {
    std::lock_guard lock(shared_->mutex);
    shared_->faults = faults;
}

void FakeYouTubeServer::addAccessToken(const QString& token) {
    std::lock_guard lock(shared_->mutex);
    shared_->accessTokens.insert(token);
}

void FakeYouTubeServer::addRefreshToken(const QString& token) {
    std::lock_guard lock(shared_->mutex);
    shared_->record.refreshTokens << token;
}

FakeYouTubeServer::Record FakeYouTubeServer::record() const {
    std::lock_guard lock(shared_->mutex);
    return shared_->record;
}

} // namespace testing_support

#pragma once

#include <QHash>
#include <QObject>
#include <QStringList>
#include <QTcpServer>
#include <QUrl>

namespace testing_support {

// A small HTTP/1.1 server on 127.0.0.1 for tests of network clients: each
// path gets a scripted answer (a status and a body, possibly late, or none at
// all); other paths get 404. Runs on the thread that made it, which must turn
// its event loop (waitUntil does). One request per connection.
class LocalHttpServer : public QObject {
    Q_OBJECT
  public:
    LocalHttpServer();
    QUrl baseUrl() const; // "http://127.0.0.1:<port>", no trailing slash

    void answer(const QString& path, int status, const QByteArray& body);
    void answerSlowly(const QString& path, int delayMs, const QByteArray& body);
    void neverAnswer(const QString& path);

    QStringList requests() const { return requests_; } // paths asked, in order
    int answered() const { return answered_; }

  private:
    struct Script {
        int status = 200;
        QByteArray body;
        int delayMs = 0;
        bool silent = false;
    };
    void serve(class QTcpSocket* socket);
    QTcpServer server_;
    QHash<QString, Script> scripts_;
    QStringList requests_;
    int answered_ = 0;
};

} // namespace testing_support

#include "LocalHttpServer.h"

#include <QTcpSocket>
#include <QTimer>

namespace testing_support {

LocalHttpServer::LocalHttpServer() {
    server_.listen(QHostAddress::LocalHost, 0);
    connect(&server_, &QTcpServer::newConnection, this, [this] {
        while (QTcpSocket* socket = server_.nextPendingConnection())
            serve(socket);
    });
}

QUrl LocalHttpServer::baseUrl() const {
    return QUrl(QStringLiteral("http://127.0.0.1:%1").arg(server_.serverPort()));
}

void LocalHttpServer::answer(const QString& path, int status, const QByteArray& body) {
    scripts_.insert(path, Script{status, body, 0, false});
}

void LocalHttpServer::answerSlowly(const QString& path, int delayMs, const QByteArray& body) {
    scripts_.insert(path, Script{200, body, delayMs, false});
}

void LocalHttpServer::neverAnswer(const QString& path) {
    scripts_.insert(path, Script{200, {}, 0, true});
}

void LocalHttpServer::serve(QTcpSocket* socket) {
    socket->setParent(this);
    auto buffer = std::make_shared<QByteArray>();
    connect(socket, &QTcpSocket::readyRead, socket, [this, socket, buffer] {
        buffer->append(socket->readAll());
        if (!buffer->contains("\r\n\r\n"))
            return;
        const QList<QByteArray> requestLine = buffer->left(buffer->indexOf("\r\n")).split(' ');
        const QString path =
            requestLine.size() > 1 ? QString::fromLatin1(requestLine[1]) : QString();
        requests_.append(path);
        const Script script = scripts_.value(path, Script{404, "null", 0, false});
        if (script.silent)
            return;
        QTimer::singleShot(script.delayMs, socket, [this, socket, script] {
            QByteArray response = "HTTP/1.1 " + QByteArray::number(script.status) +
                                  (script.status == 200 ? " OK" : " Not Found") + "\r\n";
            response += "Content-Type: application/json\r\nConnection: close\r\n";
            response += "Content-Length: " + QByteArray::number(script.body.size()) + "\r\n\r\n";
            response += script.body;
            socket->write(response);
            socket->disconnectFromHost();
            ++answered_;
        });
    });
}

} // namespace testing_support

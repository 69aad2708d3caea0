#include "MessageChannel.h"

#include <QCborValue>
#include <QSocketNotifier>
#include <QtEndian>
#include <cerrno>
#include <sys/socket.h>
#include <unistd.h>

namespace platform {

std::pair<int, int> makeSocketPair() {
    int fds[2];
    if (::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, fds) != 0)
        return {-1, -1};
    return {fds[0], fds[1]};
}

MessageChannel::MessageChannel(int socketDescriptor, QObject* parent)
    : QObject(parent), fd_(socketDescriptor) {
    if (fd_ < 0) {
        closed_ = true;
        return;
    }
    notifier_ = new QSocketNotifier(fd_, QSocketNotifier::Read, this);
    connect(notifier_, &QSocketNotifier::activated, this, &MessageChannel::readAvailable);
}

MessageChannel::~MessageChannel() {
    close();
}

bool MessageChannel::isOpen() const {
    std::lock_guard lock(sendMutex_);
    return !closed_;
}

void MessageChannel::close() {
    std::lock_guard lock(sendMutex_);
    if (closed_)
        return;
    closed_ = true;
    if (notifier_)
        notifier_->setEnabled(false);
    ::close(fd_);
}

ErrorPtr MessageChannel::send(const QCborMap& message) {
    const QByteArray payload = message.toCborValue().toCbor();
    QByteArray frame(4, '\0');
    qToBigEndian<quint32>(quint32(payload.size()), frame.data());
    frame += payload;

    std::lock_guard lock(sendMutex_);
    if (closed_)
        return makeError(EPIPE, QStringLiteral("POSIX"),
                         QStringLiteral("the connection is closed"));
    qsizetype sent = 0;
    while (sent < frame.size()) {
        const ssize_t n =
            ::send(fd_, frame.constData() + sent, size_t(frame.size() - sent), MSG_NOSIGNAL);
        if (n < 0) {
            if (errno == EINTR)
                continue;
            return posixError(errno, QStringLiteral("host connection"));
        }
        sent += n;
    }
    return nullptr;
}

void MessageChannel::readAvailable() {
    char chunk[64 * 1024];
    const ssize_t n = ::recv(fd_, chunk, sizeof chunk, MSG_DONTWAIT);
    if (n < 0 && (errno == EAGAIN || errno == EINTR))
        return;
    if (n <= 0) {
        closeFromPeer();
        return;
    }
    buffer_.append(chunk, n);

    // Deliver every whole frame; a callback may close the channel midway.
    while (buffer_.size() >= 4 && isOpen()) {
        const quint32 length = qFromBigEndian<quint32>(buffer_.constData());
        if (length > MaximumMessageSize) {
            closeFromPeer();
            return;
        }
        if (buffer_.size() < 4 + qsizetype(length))
            return;
        QCborParserError error;
        const QCborValue value = QCborValue::fromCbor(buffer_.mid(4, length), &error);
        buffer_.remove(0, 4 + length);
        if (error.error != QCborError::NoError || !value.isMap()) {
            closeFromPeer();
            return;
        }
        if (onMessage)
            onMessage(value.toMap());
    }
}

void MessageChannel::closeFromPeer() {
    if (!isOpen())
        return;
    close();
    if (onClosed)
        onClosed();
}

} // namespace platform

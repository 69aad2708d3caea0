#include "MessageChannel.h"

#include <QPointer>
#include <QSocketNotifier>
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
    const QByteArray frame = MessageFrameReader::frame(message);

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
    reader_.append(chunk, n);

    // Deliver every whole message. A callback may close the channel midway,
    // or let go of it: nothing here touches it after it is gone.
    const QPointer<MessageChannel> self(this);
    while (self && isOpen()) {
        QCborMap message;
        switch (reader_.next(&message)) {
        case MessageFrameReader::Result::NeedMore:
            return;
        case MessageFrameReader::Result::Malformed:
            closeFromPeer();
            return;
        case MessageFrameReader::Result::Message:
            // A copy: the callback may replace the channel's own.
            if (auto handler = onMessage)
                handler(message);
            break;
        }
    }
}

void MessageChannel::closeFromPeer() {
    if (!isOpen())
        return;
    close();
    if (auto handler = onClosed)
        handler();
}

} // namespace platform

#pragma once

#include "MessageFrameReader.h"
#include "platform/runtime/Error.h"

#include <QCborMap>
#include <QObject>
#include <functional>
#include <memory>
#include <mutex>

class QSocketNotifier;

namespace platform {

// One end of a stream socket carrying messages: each a CBOR map, framed by a
// 4-byte big-endian length. The channel owns the descriptor and closes it.
//
// Reading runs on the thread that created the channel (it needs that
// thread's event loop); `onMessage` and `onClosed` are called there. Sending
// may happen from any thread; it blocks only as long as the kernel takes the
// bytes. A malformed or oversized frame closes the channel: nothing the peer
// sends can crash this side.
class MessageChannel : public QObject {
    Q_OBJECT
  public:
    static constexpr qint64 MaximumMessageSize = MessageFrameReader::MaximumMessageSize;

    explicit MessageChannel(int socketDescriptor, QObject* parent = nullptr);
    ~MessageChannel() override;

    std::function<void(const QCborMap& message)> onMessage;
    // Called once, when the peer has gone or the stream became unreadable.
    std::function<void()> onClosed;

    // Sends one message; null on success, else the error (EPIPE when the peer
    // has gone). Never raises SIGPIPE.
    ErrorPtr send(const QCborMap& message);

    bool isOpen() const;
    void close();

  private:
    void readAvailable();
    void closeFromPeer();

    int fd_;
    QSocketNotifier* notifier_ = nullptr;
    MessageFrameReader reader_;
    mutable std::mutex sendMutex_;
    bool closed_ = false;
};

// A connected pair of stream sockets, both close-on-exec; {-1, -1} on failure.
std::pair<int, int> makeSocketPair();

} // namespace platform

#pragma once

#include <QByteArray>
#include <QCborMap>

namespace platform {

// The framing of the host connection: each message is a CBOR map after a
// 4-byte big-endian length. The reader takes bytes as they arrive, in pieces
// of any size, and hands back whole messages. Not thread-safe; one reader per
// stream.
class MessageFrameReader {
  public:
    static constexpr qint64 MaximumMessageSize = 16 * 1024 * 1024;

    enum class Result {
        NeedMore, // no whole message yet
        Message,  // `*message` holds the next one
        Malformed // a frame too long, not CBOR, or not a map: the stream is lost
    };

    void append(const char* data, qsizetype size);

    // The next whole message. Once Malformed, always Malformed: a stream whose
    // framing is lost cannot be trusted again.
    Result next(QCborMap* message);

    // The bytes of one framed message.
    static QByteArray frame(const QCborMap& message);

  private:
    QByteArray buffer_;
    qsizetype consumed_ = 0; // bytes at the front of buffer_ already handed out
    bool malformed_ = false;
};

} // namespace platform

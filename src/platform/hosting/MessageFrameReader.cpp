#include "MessageFrameReader.h"

#include <QCborValue>
#include <QtEndian>

namespace platform {

void MessageFrameReader::append(const char* data, qsizetype size) {
    if (malformed_ || size <= 0)
        return;
    // Drop what was handed out only now, so a burst of small messages costs
    // one move instead of one per message.
    if (consumed_ > 0) {
        buffer_.remove(0, consumed_);
        consumed_ = 0;
    }
    buffer_.append(data, size);
}

MessageFrameReader::Result MessageFrameReader::next(QCborMap* message) {
    if (malformed_)
        return Result::Malformed;
    const qsizetype available = buffer_.size() - consumed_;
    if (available < 4)
        return Result::NeedMore;
    const quint32 length = qFromBigEndian<quint32>(buffer_.constData() + consumed_);
    if (length > MaximumMessageSize) {
        malformed_ = true;
        buffer_.clear();
        return Result::Malformed;
    }
    if (available < 4 + qsizetype(length))
        return Result::NeedMore;
    QCborParserError error;
    const QCborValue value = QCborValue::fromCbor(buffer_.mid(consumed_ + 4, length), &error);
    consumed_ += 4 + qsizetype(length);
    if (error.error != QCborError::NoError || !value.isMap()) {
        malformed_ = true;
        buffer_.clear();
        consumed_ = 0;
        return Result::Malformed;
    }
    *message = value.toMap();
    return Result::Message;
}

QByteArray MessageFrameReader::frame(const QCborMap& message) {
    const QByteArray payload = message.toCborValue().toCbor();
    QByteArray bytes(4, '\0');
    qToBigEndian<quint32>(quint32(payload.size()), bytes.data());
    return bytes + payload;
}

} // namespace platform

#include "MediaFileWaiter.h"

#include "platform/publishing/PublishingError.h"

#include <QDir>
#include <QFileInfo>

namespace youtube_publishing {

namespace PublishingError = platform::PublishingError;

MediaFileWaiter::MediaFileWaiter(QObject* parent) : QObject(parent) {
    timer_.setInterval(200);
    connect(&timer_, &QTimer::timeout, this, &MediaFileWaiter::look);
}

void MediaFileWaiter::wait(const QString& hostPath,
                           std::function<void(platform::ErrorPtr error)> handler) {
    path_ = hostPath;
    handler_ = std::move(handler);
    lastPartialBytes_ = -1;
    lastSign_ = QDateTime::currentDateTimeUtc();
    // The first look comes on the next turn of the loop: the handler is never
    // called inside wait().
    QTimer::singleShot(0, this, &MediaFileWaiter::look);
    timer_.start();
}

void MediaFileWaiter::stop() {
    timer_.stop();
    handler_ = nullptr;
}

qint64 MediaFileWaiter::partialBytes() const {
    const QFileInfo info(path_);
    qint64 bytes = -1;
    const auto partials = info.dir().entryInfoList(
        {QStringLiteral(".%1.*.part").arg(info.fileName())}, QDir::Files | QDir::Hidden);
    for (const QFileInfo& partial : partials)
        bytes = std::max<qint64>(bytes, 0) + partial.size();
    return bytes;
}

void MediaFileWaiter::look() {
    if (!handler_)
        return;
    const QFileInfo info(path_);
    if (info.isFile()) {
        timer_.stop();
        auto handler = std::exchange(handler_, nullptr);
        handler(info.size() > 0 ? nullptr
                                : PublishingError::make(PublishingError::MediaUnreadable,
                                                        QStringLiteral("The video is empty")));
        return;
    }
    const qint64 partial = partialBytes();
    const QDateTime now = QDateTime::currentDateTimeUtc();
    if (partial != lastPartialBytes_) {
        lastPartialBytes_ = partial;
        lastSign_ = now;
        return;
    }
    if (lastSign_.msecsTo(now) >= stallTimeoutMs_) {
        timer_.stop();
        auto handler = std::exchange(handler_, nullptr);
        handler(PublishingError::make(PublishingError::MediaNotReady,
                                      QStringLiteral("The video to publish was never finished")));
    }
}

} // namespace youtube_publishing

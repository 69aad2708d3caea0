#pragma once

#include <QString>
#include <QVariantMap>

namespace platform {

// One posted notification. `object` is the sender's identity only: it is
// compared, never dereferenced, so it may name an object that is gone by the
// time the notification is delivered.
struct Notification {
    QString name;
    const void* object = nullptr;
    QVariantMap userInfo;
};

// Posted by the player when its current item has played to its end; the
// notification's object is the item (PlayerItem*). Delivered on the main
// queue after the player has applied its action at the item's end.
inline const QString& itemDidPlayToEndNotification() {
    static const QString name = QStringLiteral("TamselPlayerItemDidPlayToEnd");
    return name;
}

} // namespace platform

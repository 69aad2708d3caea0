#include "FrameworkStrings.h"

#include <array>
#include <mutex>

std::shared_ptr<platform::Bundle> TXQuillonFrameworkBundle() {
    // Callers on any thread share the cache, so it is guarded. Not a run-once
    // guard: a lookup that finds nothing is tried again on the next call.
    static std::mutex mutex;
    static std::shared_ptr<platform::Bundle> bundle;
    std::lock_guard lock(mutex);
    if (!bundle)
        bundle = platform::Bundle::bundleForClass(QStringLiteral("PhotoAlbum"));
    return bundle;
}

QString TXLocalizedFrameworkString(const QString& key) {
    const auto bundle = TXQuillonFrameworkBundle();
    if (!bundle)
        return key;
    static const std::array<QString, 4> tables = {
        QStringLiteral("TamselAlbum-Desktop"), // this device's own table
        QStringLiteral("TamselAlbum"),
        QStringLiteral("TamselAlbumSharing"),
        QStringLiteral("TamselAlbumPublishing"),
    };
    QString text = key;
    for (const QString& table : tables) {
        text = bundle->localizedStringForKey(key, QStringLiteral(""), table);
        if (text != key)
            return text;
    }
    return text;
}

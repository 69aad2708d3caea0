#include "FrameworkStrings.h"

#include <array>

std::shared_ptr<platform::Bundle> TXQuillonFrameworkBundle() {
    // A plain cache: two threads racing on first use both find the same
    // bundle, which is harmless.
    static std::shared_ptr<platform::Bundle> bundle;
    if (!bundle)
        bundle = platform::Bundle::bundleForClass(QStringLiteral("PhotoAlbum"));
    return bundle;
}

QString TXLocalizedFrameworkString(const QString& key) {
    const auto bundle = TXQuillonFrameworkBundle();
    if (!bundle)
        return key;
    static const std::array<QString, 4> tables = {
        QStringLiteral("Photos-Desktop"), // this device's own table
        QStringLiteral("Photos"),
        QStringLiteral("PhotosSharing"),
        QStringLiteral("PhotosPublishing"),
    };
    QString text = key;
    for (const QString& table : tables) {
        text = bundle->localizedStringForKey(key, QStringLiteral(""), table);
        if (text != key)
            return text;
    }
    return text;
}

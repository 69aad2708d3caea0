#include "PluginStrings.h"

#include "platform/services/Bundle.h"

namespace youtube_publishing {

QString localized(const char* key, const char* english) {
    const auto bundle = platform::Bundle::bundleWithPath(
        QStringLiteral("/System/Library/Publishing/YouTubePublishing.bundle"));
    if (!bundle)
        return QString::fromUtf8(english);
    return bundle->localizedStringForKey(QString::fromLatin1(key), QString::fromUtf8(english),
                                         QStringLiteral("YouTubePublishing"));
}

} // namespace youtube_publishing

// A desktop entry file of an installed application: its [Desktop Entry]
// group, escapes and localised keys.

#include "platform/services/DesktopEntry.h"

#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const QString text = QString::fromUtf8(reinterpret_cast<const char*>(data), qsizetype(size));
    if (const auto entry = platform::DesktopEntry::parse(text)) {
        entry->value(QStringLiteral("Name"));
        entry->localizedValues(QStringLiteral("Name"));
        entry->localizedValues(QStringLiteral("Comment"));
    }
    return 0;
}

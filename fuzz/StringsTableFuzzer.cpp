// A string table as the bundles ship it, or as a damaged file holds it: any
// bytes, in UTF-8 or UTF-16 with a byte-order mark.

#include "platform/services/StringsTable.h"

#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const QByteArray bytes(reinterpret_cast<const char*>(data), qsizetype(size));
    if (const auto table = platform::parseStringsData(bytes))
        for (auto it = table->cbegin(); it != table->cend(); ++it)
            (void)it.value().toString().size();
    return 0;
}

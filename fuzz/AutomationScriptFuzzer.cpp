// An automation script: one command a line, quoted words, numbers.

#include "AutomationScript.h"

#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const QString text = QString::fromUtf8(reinterpret_cast<const char*>(data), qsizetype(size));
    QString error;
    parseAutomationScript(text, &error);
    return 0;
}

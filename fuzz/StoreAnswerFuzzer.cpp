// The remote store catalogue's answer about an application: whatever the
// server (or something pretending to be it) sends back.

#include "platform/services/store/RemoteCatalogue.h"

#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const QByteArray body(reinterpret_cast<const char*>(data), qsizetype(size));
    QString why;
    platform::RemoteCatalogue::parseAnswer(body, QUrl(QStringLiteral("https://store.example/")),
                                           QStringLiteral("org.example.Racer"), &why);
    return 0;
}

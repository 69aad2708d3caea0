// The host connection as either side reads it: framed CBOR messages, arriving
// in pieces of any size; the request's input items and their values (the
// extension's side); the finish report (the host's side).

#include "platform/hosting/ExtensionItem.h"
#include "platform/hosting/HostMessages.h"
#include "platform/hosting/MessageFrameReader.h"

#include <cstdint>

using namespace platform;

namespace {

void readMessage(const QCborMap& message) {
    if (message.value(QStringLiteral("type")).toString() == HostMessages::Request) {
        for (const ExtensionItem& item :
             decodeExtensionItems(message.value(QStringLiteral("inputItems")))) {
            for (const auto& provider : item.attachments)
                if (provider->hasItemConformingToTypeIdentifier(
                        ItemProvider::GenericDataTypeIdentifier))
                    ItemProvider::decode(provider->wireValue());
        }
    }
    HostMessages::activityTypesOfReport(message);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0)
        return 0;
    // The first byte portions the stream, as the socket may.
    const std::size_t piece = std::size_t(data[0]) + 1;
    MessageFrameReader reader;
    for (std::size_t at = 1; at < size; at += piece) {
        reader.append(reinterpret_cast<const char*>(data) + at,
                      qsizetype(std::min(piece, size - at)));
        QCborMap message;
        for (;;) {
            const auto result = reader.next(&message);
            if (result != MessageFrameReader::Result::Message)
                break;
            readMessage(message);
        }
    }
    return 0;
}

// What the YouTube Data API (or anything answering in its place) sends back:
// a status, a 308's Range header and a body, read as the upload client and
// the category picker read them.
//
// Input: two bytes of status, then the Range header up to the first line
// break, then the body.

#include "ApiAnswer.h"

#include <cstdint>

using youtube_publishing::ApiAnswer;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size < 2)
        return 0;
    const int status = (data[0] << 8 | data[1]) % 600;
    const QByteArray rest(reinterpret_cast<const char*>(data) + 2, qsizetype(size - 2));
    const qsizetype lineEnd = rest.indexOf('\n');
    const QByteArray range = lineEnd < 0 ? rest : rest.left(lineEnd);
    const QByteArray body = lineEnd < 0 ? QByteArray() : rest.mid(lineEnd + 1);

    const ApiAnswer answer = ApiAnswer::classify(status, body, QStringLiteral("no route"));
    if (answer.error)
        (void)answer.error->description().size();
    ApiAnswer::categoriesOf(body);
    ApiAnswer::videoIdOf(body);
    const qint64 held = ApiAnswer::heldBytesOf(range);
    if (held < 0)
        __builtin_trap(); // a server cannot hold a negative number of bytes
    return 0;
}

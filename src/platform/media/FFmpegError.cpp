#include "FFmpegError.h"

#include "Asset.h"
#include "FFmpegHandles.h"

namespace platform::ffmpeg {

ErrorPtr failure(int averror, const QString& what) {
    return makeError(averror, mediaErrorDomain(), what + QStringLiteral(": ") + errorText(averror));
}

} // namespace platform::ffmpeg

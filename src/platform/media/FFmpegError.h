#pragma once

// For the media adapter only.

#include "platform/runtime/Error.h"

#include <QString>

namespace platform::ffmpeg {

// The media domain's error for a failed FFmpeg call: its code is `averror`,
// its message says `what` went wrong, a colon, and FFmpeg's text for the code.
ErrorPtr failure(int averror, const QString& what);

} // namespace platform::ffmpeg

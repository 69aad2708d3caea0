#pragma once

#include "platform/media/MediaTime.h"

#include <QString>
#include <vector>

namespace platform {

// Shortens the edit lists of a finished MP4 (sample tables after the
// samples, as the muxer writes them) in place, so that track i plays for at
// most `durations[i]`: the last edit of each track, the track header's
// duration and the movie header's. Needed when samples past the end had to
// be copied (references of reordered frames), which the muxer would show.
// Returns false, with `error` set, when the file's boxes are not as expected;
// the file is then unchanged.
bool shortenEdits(const QString& hostPath, const std::vector<MediaTime>& durations, QString* error);

} // namespace platform

#pragma once

extern "C" {
struct AVFormatContext;
}

#include <QString>

namespace platform {

// Sets the true lengths of the streams of a just-opened input where its
// headers do not give them: a fragmented MP4 (whose movie box says nothing
// of the fragments, and whose last fragment may be cut short) ends with its
// last complete fragment; a Matroska file (which states no stream lengths,
// and no duration at all when written live and cut short) ends with its last
// complete block. Other inputs are left as they are. Internal to the media adapter.
void settleEnds(AVFormatContext* input, const QString& hostPath);

} // namespace platform

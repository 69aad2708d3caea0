#pragma once

#include "ExportJob.h"

namespace platform {

// Writes the clip of an export by reading the source once: the streams that
// the job's rule lets it copy are copied (TrackCopier), the others decoded
// and encoded (VideoTranscoder, AudioTranscoder, which also mixes the audio
// tracks that the audio mix names together). Every track starts at the frame
// shown at the requested start; copied video is cut at the keyframe before it
// and the edit list hides the lead. Internal to the media adapter.
class ClipWriter {
  public:
    explicit ClipWriter(const ExportJob& job) : job_(job) {}
    // Null on success.
    ErrorPtr run();

  private:
    const ExportJob& job_;
};

} // namespace platform

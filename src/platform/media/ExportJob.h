#pragma once

#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"

#include <atomic>
#include <functional>
#include <optional>

namespace platform {

// What the session hands to the code that writes the file: where from, where
// to (the temporary name), which range (already clipped to the asset), and how
// to report. Internal to the media adapter.
struct ExportJob {
    QString sourcePath;
    QString outputPath;
    MediaTimeRange range;
    std::optional<AudioMix> audioMix;
    const std::atomic<bool>* cancelled = nullptr;
    std::function<void(float)> progress;

    bool isCancelled() const { return cancelled && cancelled->load(); }
};

// The code an export reports when it stopped because it was cancelled.
constexpr int kExportCancelledCode = -0x54584e43; // FFERRTAG-like, distinct from FFmpeg's

// Copies the samples of the range (pass-through preset). Null on success.
ErrorPtr runPassthroughExport(const ExportJob& job);

// The pass-through export's fast path: when the source's samples can be
// copied as one span of the file, writes the clip that way and returns true
// (with `error` null on success). Returns false, having written nothing,
// when the source does not qualify; the remuxer then does the work.
bool trySpanCopyExport(const ExportJob& job, ErrorPtr* error);

// Decodes and re-encodes the range to H.264 and AAC, applying the audio mix
// (highest-quality preset). Null on success.
ErrorPtr runReencodeExport(const ExportJob& job);

} // namespace platform

#pragma once

#include "ExportRules.h"
#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"

#include <atomic>
#include <functional>
#include <optional>

namespace platform {

// What the session hands to the code that writes the file: where from, where
// to (the temporary name), which range (already clipped to the asset; 0 is the
// movie's first sample), what may be copied, and how to report. Internal to
// the media adapter.
struct ExportJob {
    QString sourcePath;
    QString outputPath;
    MediaTimeRange range;
    CopyRule rule = CopyRule::WhatMp4Holds;
    std::optional<AudioMix> audioMix;
    const std::atomic<bool>* cancelled = nullptr;
    std::function<void(float)> progress;

    bool isCancelled() const { return cancelled && cancelled->load(); }
};

// The code an export reports when it stopped because it was cancelled.
constexpr int kExportCancelledCode = -0x54584e43; // FFERRTAG-like, distinct from FFmpeg's

// Writes the clip: the span copy when the source qualifies, else the
// ClipWriter. Null on success.
ErrorPtr runExport(const ExportJob& job);

// The fast path: when every track is copied and the source's samples of the
// range can be copied as one span of the file, writes the clip that way and
// returns true (with `error` null on success). Returns false, having written
// nothing, when the source does not qualify.
bool trySpanCopyExport(const ExportJob& job, ErrorPtr* error);

} // namespace platform

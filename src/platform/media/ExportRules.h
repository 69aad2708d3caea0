#pragma once

#include <cstdint>

extern "C" {
#include <libavcodec/codec_id.h>
}

// Which streams an export copies as they are and how it encodes the rest.
// Both presets run the same machinery; they differ only in these rules.
// Internal to the media adapter.
namespace platform {

enum class CopyRule {
    // The pass-through preset: every stream that MP4 holds as it is (a codec
    // registered for MP4 that the muxer writes) is copied.
    WhatMp4Holds,
    // The highest-quality preset, made for uploading: only what MP4 holds and
    // the video sites take without complaint (H.264, HEVC, VP9, AV1; AAC,
    // Opus) is copied.
    WhatUploadsAccept,
};

// True when a stream of this codec is copied untouched under the rule.
bool copiesAsItIs(CopyRule rule, AVCodecID codec);

// How streams that cannot be copied are encoded: H.264 at constant quality
// 18 (libx264, with the preset named here) and AAC at 192 kbit/s.
struct EncodingSettings {
    const char* x264Preset;
    double crf = 18;
    long audioBitRate = 192000;
};
EncodingSettings encodingSettingsFor(CopyRule rule);

} // namespace platform

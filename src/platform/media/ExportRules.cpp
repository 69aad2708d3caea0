#include "ExportRules.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

#include <algorithm>
#include <array>

namespace platform {
namespace {

// Codecs registered for MP4. The muxer accepts a few more (Vorbis among
// them) under private identifiers that players do not read.
constexpr std::array kRegisteredForMp4 = {
    AV_CODEC_ID_H264,  AV_CODEC_ID_HEVC, AV_CODEC_ID_VP9,  AV_CODEC_ID_AV1,
    AV_CODEC_ID_MPEG4, AV_CODEC_ID_AAC,  AV_CODEC_ID_OPUS, AV_CODEC_ID_MP3,
    AV_CODEC_ID_AC3,   AV_CODEC_ID_EAC3, AV_CODEC_ID_FLAC, AV_CODEC_ID_ALAC,
};

constexpr std::array kAcceptedForUpload = {
    AV_CODEC_ID_H264, AV_CODEC_ID_HEVC, AV_CODEC_ID_VP9,
    AV_CODEC_ID_AV1,  AV_CODEC_ID_AAC,  AV_CODEC_ID_OPUS,
};

template <typename List> bool contains(const List& list, AVCodecID codec) {
    return std::find(list.begin(), list.end(), codec) != list.end();
}

bool muxerWrites(AVCodecID codec) {
    static const AVOutputFormat* mp4 = av_guess_format("mp4", nullptr, nullptr);
    return mp4 && avformat_query_codec(mp4, codec, FF_COMPLIANCE_NORMAL) == 1;
}

} // namespace

bool copiesAsItIs(CopyRule rule, AVCodecID codec) {
    const bool listed = rule == CopyRule::WhatMp4Holds ? contains(kRegisteredForMp4, codec)
                                                       : contains(kAcceptedForUpload, codec);
    return listed && muxerWrites(codec);
}

EncodingSettings encodingSettingsFor(CopyRule rule) {
    // A save is waited for by the user at the tap; an upload is watched by
    // many and is sent over the network, so it gets the slower, tighter
    // encoder settings.
    return rule == CopyRule::WhatMp4Holds ? EncodingSettings{"veryfast"}
                                          : EncodingSettings{"medium"};
}

} // namespace platform

#include "ExportRules.h"

#include <gtest/gtest.h>

using namespace platform;

TEST(ExportRules, PassThroughCopiesWhatMp4HoldsAndUploadsWhatTheSitesTake) {
    for (AVCodecID copied : {AV_CODEC_ID_H264, AV_CODEC_ID_HEVC, AV_CODEC_ID_VP9, AV_CODEC_ID_AV1,
                             AV_CODEC_ID_AAC, AV_CODEC_ID_OPUS}) {
        EXPECT_TRUE(copiesAsItIs(CopyRule::WhatMp4Holds, copied)) << avcodec_get_name(copied);
        EXPECT_TRUE(copiesAsItIs(CopyRule::WhatUploadsAccept, copied)) << avcodec_get_name(copied);
    }
    // The muxer writes Vorbis under a private tag that players ignore: it is
    // encoded, as VP8 (which MP4 cannot hold at all) is.
    for (AVCodecID encoded : {AV_CODEC_ID_VP8, AV_CODEC_ID_VORBIS, AV_CODEC_ID_THEORA}) {
        EXPECT_FALSE(copiesAsItIs(CopyRule::WhatMp4Holds, encoded)) << avcodec_get_name(encoded);
        EXPECT_FALSE(copiesAsItIs(CopyRule::WhatUploadsAccept, encoded))
            << avcodec_get_name(encoded);
    }
    // MP4 holds these, but an upload gets AAC.
    for (AVCodecID mp4Only : {AV_CODEC_ID_MP3, AV_CODEC_ID_FLAC, AV_CODEC_ID_AC3}) {
        EXPECT_TRUE(copiesAsItIs(CopyRule::WhatMp4Holds, mp4Only)) << avcodec_get_name(mp4Only);
        EXPECT_FALSE(copiesAsItIs(CopyRule::WhatUploadsAccept, mp4Only))
            << avcodec_get_name(mp4Only);
    }
}

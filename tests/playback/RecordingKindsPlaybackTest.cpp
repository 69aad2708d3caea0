// Recordings as Linux screen recorders write them preview like any other:
// ready with the asset's length, playing from where the user seeks to the
// end, on the same timeline as the strip and the save.

#include "PlaybackFixture.h"
#include "platform/media/Asset.h"
#include "platform/media/playback/Player.h"
#include "support/Wait.h"

#include <gtest/gtest.h>

using namespace platform;
using namespace playback_test;
using namespace testmedia;

TEST(PlaybackRecordingKinds, PreviewToTheEnd) {
    const auto make = [](Container c, VideoCodec v, AudioCodec a, bool cutShort, int start = 0) {
        MovieSpec s = plain(cutShort ? 4 : 2);
        s.container = c;
        s.videoCodec = v;
        s.audioCodec = a;
        s.truncated = cutShort;
        s.startSeconds = start;
        return s;
    };
    const struct {
        const char* name;
        MovieSpec movie;
    } cases[] = {
        {"webm-vp8-vorbis", make(Container::WebM, VideoCodec::VP8, AudioCodec::Vorbis, false)},
        {"fragmented-cut-short",
         make(Container::FragmentedMp4, VideoCodec::H264, AudioCodec::AAC, true)},
        {"webm-cut-short", make(Container::WebM, VideoCodec::VP9, AudioCodec::Opus, true)},
        {"matroska-late", make(Container::Matroska, VideoCodec::HEVC, AudioCodec::AAC, false, 30)},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.name);
        const QUrl url = clipUrl(QString::fromLatin1(c.name), c.movie);
        const auto asset = Asset::assetWithURL(url);
        ASSERT_FALSE(asset->error());
        auto item = PlayerItem::playerItemWithURL(url);
        EndWatcher end(item);
        auto player = readyPlayer(item);
        const double duration = item->duration().seconds();
        EXPECT_NEAR(duration, asset->duration().seconds(), 1e-3);
        EXPECT_GT(duration, 1.0);
        // The timeline starts at 0 whatever the file's timestamps do.
        EXPECT_NEAR(player->currentTime().seconds(), 0.0, 1e-3);
        player->seekToTime(MediaTime::fromSeconds(duration - 0.5, 600));
        player->play();
        ASSERT_TRUE(end.waitFor(1));
        EXPECT_NEAR(player->currentTime().seconds(), duration, 0.1);
    }
}

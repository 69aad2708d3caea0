// Recordings as Linux screen recorders write them preview like any other:
// ready with the asset's length, playing from where the user seeks to the
// end, on the same timeline as the strip and the save.

#include "PlaybackFixture.h"
#include "platform/media/Asset.h"
#include "platform/media/playback/Player.h"
#include "support/Wait.h"

#include <gtest/gtest.h>

using namespace platform;
using playback_test::EndWatcher;
using playback_test::waitForStatus;
using testing_support::waitUntil;
using testmedia::AudioCodec;
using testmedia::Container;
using testmedia::MovieSpec;
using testmedia::VideoCodec;

TEST(PlaybackRecordingKinds, PreviewToTheEnd) {
    struct Case {
        const char* name;
        MovieSpec movie;
    };
    auto make = [](Container c, VideoCodec v, AudioCodec a, auto&& tweak) {
        MovieSpec s;
        s.seconds = 2;
        s.container = c;
        s.videoCodec = v;
        s.audioCodec = a;
        tweak(s);
        return s;
    };
    const Case cases[] = {
        {"webm-vp8-vorbis",
         make(Container::WebM, VideoCodec::VP8, AudioCodec::Vorbis, [](auto&) {})},
        {"fragmented-cut-short", make(Container::FragmentedMp4, VideoCodec::H264, AudioCodec::AAC,
                                      [](MovieSpec& s) {
                                          s.seconds = 4;
                                          s.truncated = true;
                                      })},
        {"webm-cut-short", make(Container::WebM, VideoCodec::VP9, AudioCodec::Opus,
                                [](MovieSpec& s) {
                                    s.seconds = 4;
                                    s.truncated = true;
                                })},
        {"matroska-late", make(Container::Matroska, VideoCodec::HEVC, AudioCodec::AAC,
                               [](MovieSpec& s) { s.startSeconds = 30; })},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        const QUrl url = playback_test::clipUrl(QString::fromLatin1(c.name), c.movie);
        const auto asset = Asset::assetWithURL(url);
        ASSERT_FALSE(asset->error());
        auto item = PlayerItem::playerItemWithURL(url);
        EndWatcher end(item);
        auto player = Player::playerWithPlayerItem(item);
        ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
        const double duration = item->duration().seconds();
        EXPECT_NEAR(duration, asset->duration().seconds(), 1e-3);
        EXPECT_GT(duration, 1.0);
        // The timeline starts at 0 whatever the file's timestamps do.
        EXPECT_NEAR(player->currentTime().seconds(), 0.0, 1e-3);
        player->seekToTime(MediaTime::fromSeconds(duration - 0.5, 600));
        player->play();
        ASSERT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));
        EXPECT_NEAR(player->currentTime().seconds(), duration, 0.1);
    }
}

// The scrubber's data source: time stamps, sizes and the thumbnail cache.

#include "EditorOnFakes.h"
#include "platform/ui/Screen.h"

#include <cmath>

using namespace platform;

using EditorThumbnails = EditorOnFakes;

TEST_F(EditorThumbnails, TimeStampsAreEvenlySpacedAndStopPastTheDuration) {
    makeEditor();
    auto stamps = [&](int n, double s, double e) {
        return editor->movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(
            editor->avTrimmer.get(), n, s, e);
    };
    EXPECT_EQ(stamps(10, 0.0, 0.0), QList<double>{0.0});
    EXPECT_EQ(stamps(10, 0.0, 10.0), (QList<double>{0, 1, 2, 3, 4, 5, 6, 7, 8, 9}));
    EXPECT_EQ(stamps(10, 0.0, 20.0), (QList<double>{0, 2, 4, 6, 8, 10}))
        << "10 is kept: it is not past the end";
    EXPECT_TRUE(stamps(0, 0.0, 10.0).isEmpty());
}

TEST_F(EditorThumbnails, AQuarterTurnSwapsTheSizeAndNoVideoHasNone) {
    const QUrl portrait = QUrl::fromLocalFile("/recordings/portrait.mp4");
    fakes.world().addMovie(portrait, {.rotationDegrees = 90});
    makeEditor(QColor(), portrait);
    EXPECT_EQ(editor->getVideoSize(), QSizeF(240, 320));
    EXPECT_FLOAT_EQ(editor->movieScrubberThumbnailAspectRatio(editor->avTrimmer.get()), 0.75f);
    const double k = Screen::mainScreen().scale();
    EXPECT_EQ(editor->getThumbnailSize(), QSizeF(std::rint(0.75 * 38 * k) * k, 38 * k));

    const QUrl sound = QUrl::fromLocalFile("/recordings/sound.mp4");
    fakes.world().addMovie(sound, {.video = false});
    makeEditor(QColor(), sound);
    EXPECT_EQ(editor->getVideoSize(), QSizeF(0, 0));
    EXPECT_FLOAT_EQ(editor->movieScrubberThumbnailAspectRatio(editor->avTrimmer.get()), 1.0f);
}

TEST_F(EditorThumbnails, EachStampIsMadeOnceAtTheThumbnailSizeAndThenServedFromTheCache) {
    fakes.world().change([](auto& world) { world.failingTimes = {3.0}; });
    makeEditor();
    drainQueues(); // what the scrubber asked for when the item became ready
    const auto made = [&] { return fakes.world().state().generatedTimes; };
    const int before = made().size();
    const auto request = [&](double stamp) {
        editor->movieScrubber_requestThumbnailImageForTimestamp(editor->avTrimmer.get(), stamp);
        drainQueues();
    };

    request(2.5);
    EXPECT_EQ(made().size(), before + 1);
    EXPECT_EQ(fakes.world().state().lastMaximumSize, editor->getThumbnailSize());
    ASSERT_TRUE(editor->cachedTimeStamps->contains(2.5));
    EXPECT_FALSE(editor->cachedTimeStamps->value(2.5).isNull());
    request(2.5);
    EXPECT_EQ(made().size(), before + 1) << "a cache hit decodes nothing";
    request(3.0);
    EXPECT_FALSE(editor->cachedTimeStamps->contains(3.0)) << "a frame that cannot be made";

    // A size change drops generator and cache (the scrubber's reload at once
    // asks again, of a new generator): the stamp is made again.
    const std::shared_ptr<ImageGenerator> old = editor->thumbnailGenerator;
    editor->refreshAVRotation();
    EXPECT_NE(editor->thumbnailGenerator, old);
    EXPECT_FALSE(editor->cachedTimeStamps->contains(2.5));
    drainQueues();
    request(2.5);
    EXPECT_EQ(made().count(2.5), 2);
}

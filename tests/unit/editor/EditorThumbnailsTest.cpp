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
    fakes::FakeMovie turned;
    turned.rotationDegrees = 90;
    fakes.world().addMovie(portrait, turned);
    makeEditor(QColor(), portrait);
    EXPECT_EQ(editor->getVideoSize(), QSizeF(240, 320));
    EXPECT_FLOAT_EQ(editor->movieScrubberThumbnailAspectRatio(editor->avTrimmer.get()), 0.75f);
    const double k = Screen::mainScreen().scale();
    EXPECT_EQ(editor->getThumbnailSize(), QSizeF(std::rint(0.75 * 38 * k) * k, 38 * k));

    const QUrl sound = QUrl::fromLocalFile("/recordings/sound.mp4");
    fakes::FakeMovie audioOnly;
    audioOnly.video = false;
    fakes.world().addMovie(sound, audioOnly);
    makeEditor(QColor(), sound);
    EXPECT_EQ(editor->getVideoSize(), QSizeF(0, 0));
    EXPECT_FLOAT_EQ(editor->movieScrubberThumbnailAspectRatio(editor->avTrimmer.get()), 1.0f);
}

TEST_F(EditorThumbnails, EachStampIsMadeOnceAtTheThumbnailSizeAndThenServedFromTheCache) {
    makeEditor();
    drainQueues(); // what the scrubber asked for when the item became ready
    const int before = fakes.world().generatedTimes().size();

    editor->movieScrubber_requestThumbnailImageForTimestamp(editor->avTrimmer.get(), 2.5);
    drainQueues();
    EXPECT_EQ(fakes.world().generatedTimes().size(), before + 1);
    EXPECT_EQ(fakes.world().lastMaximumSize(), editor->getThumbnailSize());
    ASSERT_TRUE(editor->cachedTimeStamps->contains(2.5));
    EXPECT_FALSE(editor->cachedTimeStamps->value(2.5).isNull());

    editor->movieScrubber_requestThumbnailImageForTimestamp(editor->avTrimmer.get(), 2.5);
    drainQueues();
    EXPECT_EQ(fakes.world().generatedTimes().size(), before + 1) << "a cache hit decodes nothing";

    // A size change drops generator and cache (the scrubber's reload at once
    // asks again, of a new generator): the stamp is made again.
    const std::shared_ptr<ImageGenerator> old = editor->thumbnailGenerator;
    editor->refreshAVRotation();
    EXPECT_NE(editor->thumbnailGenerator, old);
    EXPECT_FALSE(editor->cachedTimeStamps->contains(2.5));
    drainQueues();
    editor->movieScrubber_requestThumbnailImageForTimestamp(editor->avTrimmer.get(), 2.5);
    drainQueues();
    EXPECT_EQ(fakes.world().generatedTimes().count(2.5), 2);
}

TEST_F(EditorThumbnails, AFrameThatCannotBeMadeLeavesItsSlotEmpty) {
    fakes.world().failGenerationAt(3.0);
    makeEditor();
    editor->movieScrubber_requestThumbnailImageForTimestamp(editor->avTrimmer.get(), 3.0);
    drainQueues();
    EXPECT_FALSE(editor->cachedTimeStamps->contains(3.0));
}

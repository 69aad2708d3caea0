#include "scrubber/ScrubberFixture.h"

#include "support/Wait.h"

#include <QImage>
#include <QPointingDevice>
#include <QTest>
#include <cmath>

using testing_support::ScrubberFixture;
using Values = std::vector<double>;

TEST_F(ScrubberFixture, DraggingThePlayheadReportsBeginValuesEndInOrderWithinTheMovie) {
    press(xAt(2.5));
    move(xAt(4.0));
    move(xAt(4.0)); // no change, no call
    release(xAt(5.0));
    EXPECT_EQ(client->names(),
              (QStringList{"beginScrubbing", "value", "value", "value", "endScrubbing"}));
    EXPECT_EQ(client->valuesOf("value"), (Values{2.5, 4.0, 5.0}));
    EXPECT_DOUBLE_EQ(scrubber->value(), 5.0);

    client->calls.clear();
    drag(xAt(3.0), 500.0);
    drag(xAt(3.0), -50.0);
    EXPECT_EQ(client->valuesOf("value"), (Values{3.0, 10.0, 3.0, 0.0}));

    // While editing the playhead stays inside the trim range.
    scrubber->setEditable(true);
    scrubber->setStartValue(2.0);
    scrubber->setEndValue(6.0);
    scrubber->setEditing_animated(true, false);
    client->calls.clear();
    press(xAt(4.0));
    move(xAt(9.0));
    move(xAt(0.5));
    release(xAt(0.5));
    EXPECT_EQ(client->valuesOf("value"), (Values{4.0, 6.0, 2.0}));
    EXPECT_TRUE(client->callsNamed("beginEditing").empty());
}

TEST_F(ScrubberFixture, DraggingAHandleBeginsEditingOnceAndReportsItsValues) {
    scrubber->setValue(5.0);
    drag(5.0, xAt(2.0));
    EXPECT_FALSE(scrubber->isEditing()) << "not editable: the handle area scrubs";
    EXPECT_EQ(client->valuesOf("value"), (Values{0.0, 2.0}));

    scrubber->setEditable(true);
    client->calls.clear();
    // The start handle stands in the inset left of the strip; take it by its
    // inner edge so the pointer sits exactly on the start time.
    drag(xAt(0.0), xAt(2.0));
    drag(xAt(10.0) + 5, xAt(7.0) + 5); // end handle, grabbed in its middle
    EXPECT_TRUE(scrubber->isEditing());
    EXPECT_EQ(client->names(), (QStringList{"beginEditing", "start", "end"}));
    EXPECT_EQ(client->valuesOf("start"), Values{2.0});
    EXPECT_EQ(client->valuesOf("end"), Values{7.0});
    EXPECT_DOUBLE_EQ(scrubber->startValue(), 2.0);
    EXPECT_DOUBLE_EQ(scrubber->endValue(), 7.0);
}

TEST_F(ScrubberFixture, HandlesStayInsideTheMovieAndAtLeastTheMinimumApart) {
    scrubber->setEditable(true);
    scrubber->setMinimumTrimLength(1.5);
    drag(xAt(0.0), xAt(9.5)); // start pushed against the end
    EXPECT_DOUBLE_EQ(scrubber->startValue(), 8.5);
    drag(xAt(10.0), xAt(2.0)); // end pushed against the start
    EXPECT_DOUBLE_EQ(scrubber->endValue(), 10.0);
    drag(xAt(8.5), -100.0);    // start pulled out of the movie
    drag(xAt(10.0), xAt(0.5)); // end pulled back to the start
    drag(xAt(1.5), 600.0);     // and out of the movie
    EXPECT_EQ(client->valuesOf("start"), (Values{8.5, 0.0}));
    EXPECT_EQ(client->valuesOf("end"), (Values{1.5, 10.0}));
    EXPECT_EQ(client->callsNamed("beginEditing").size(), 1u);
}

TEST_F(ScrubberFixture, InterruptedGesturesStillEndAndReentrantCallsAreSafe) {
    press(xAt(1.0));
    scrubber->hide();
    release(xAt(2.0));
    EXPECT_EQ(client->names(), (QStringList{"beginScrubbing", "value", "endScrubbing"}));

    scrubber->show();
    client->calls.clear();
    client->onBeginScrubbing = [](platform::MovieScrubber* s) { s->reloadData(); };
    drag(xAt(3.0), xAt(4.0));
    client->onBeginScrubbing = nullptr;
    EXPECT_EQ(client->callsNamed("endScrubbing").size(), 1u);
    EXPECT_TRUE(client->callsNamed("value").empty());

    // The delegate goes away mid-drag: the control keeps working silently.
    press(xAt(1.0));
    std::weak_ptr<platform::MovieScrubberDelegate> keep = client;
    client.reset();
    EXPECT_TRUE(keep.expired());
    move(xAt(2.0));
    release(xAt(2.0));
    EXPECT_DOUBLE_EQ(scrubber->value(), 2.0);
}

TEST_F(ScrubberFixture, EscapeLeavesEditingAndTellsTheDelegate) {
    scrubber->setEditable(true);
    client->onCancelEditing = [](platform::MovieScrubber* s) {
        s->setEditing_animated(false, true);
    };
    drag(xAt(0.0), xAt(1.0));
    key(Qt::Key_Escape);
    EXPECT_FALSE(scrubber->isEditing());
    key(Qt::Key_Escape);
    EXPECT_EQ(client->names(), (QStringList{"beginEditing", "start", "cancelEditing"}));
    EXPECT_DOUBLE_EQ(scrubber->startValue(), 1.0) << "the range outlives the cancel";
}

TEST_F(ScrubberFixture, HoldingAHandleStillZoomsForFineTrimmingAndReleaseZoomsBack) {
    scrubber->setEditable(true);
    scrubber->setZoomDelay(0.05);
    press(xAt(10.0));
    move(xAt(8.0));
    ASSERT_TRUE(testing_support::waitUntil([&] { return scrubber->isZoomed(); }, 5000));
    // Fine trimming: 40 px now move the end by a tenth of a second, not one.
    move(xAt(8.0) - 40.0);
    EXPECT_NEAR(scrubber->endValue(), 7.9, 1e-9);

    const auto stamps = client->callsNamed("stamps");
    ASSERT_FALSE(stamps.empty());
    const double from = stamps.back().value, to = stamps.back().end;
    EXPECT_TRUE(from >= 0.0 && to <= 10.0 && to - from < 2.0) << "a closer look, not the movie";

    // Once zoomed in, the closer thumbnails are drawn across the strip.
    ASSERT_TRUE(testing_support::waitUntil(
        [&] { return std::abs(scrubber->positionForTime(from) - xAt(0.0)) < 0.01; }, 5000));
    QImage blue(16, 9, QImage::Format_RGB32);
    blue.fill(Qt::blue);
    scrubber->setThumbnailImage_forTimestamp(blue, from);
    EXPECT_EQ(scrubber->grab().toImage().pixelColor(int(xAt(0.0)) + 10, 19), QColor(Qt::blue));

    release(xAt(8.0) - 40.0);
    EXPECT_FALSE(scrubber->isZoomed());
    EXPECT_NEAR(scrubber->endValue(), 7.9, 1e-9);
}

TEST_F(ScrubberFixture, TouchDragsLikeTheMouse) {
    QPointingDevice* device = QTest::createTouchDevice();
    QTest::touchEvent(scrubber.get(), device).press(0, QPoint(int(xAt(2.0)), 19));
    QTest::touchEvent(scrubber.get(), device).move(0, QPoint(int(xAt(3.0)), 19));
    QTest::touchEvent(scrubber.get(), device).release(0, QPoint(int(xAt(3.0)), 19));
    EXPECT_EQ(client->names(), (QStringList{"beginScrubbing", "value", "value", "endScrubbing"}));
    EXPECT_EQ(client->valuesOf("value"), (Values{2.0, 3.0}));
}

#include "scrubber/ScrubberFixture.h"

#include <QAccessible>
#include <QAccessibleValueInterface>
#include <QTest>

using testing_support::ScrubberFixture;
using Handle = platform::MovieScrubberHandle;
using Values = std::vector<double>;

namespace {
const QStringList kOneStep{"beginScrubbing", "value", "endScrubbing"};
}

TEST_F(ScrubberFixture, ArrowKeysAndStepsStepThePlayheadByFramesEachAsAWholeScrub) {
    client->frame = 0.1;
    scrubber->setValue(0.95);
    key(Qt::Key_Right);                                          // to the next frame boundary
    key(Qt::Key_Right, Qt::ShiftModifier);                       // ten frames
    EXPECT_TRUE(scrubber->stepPart(Handle::Playhead, -1, true)); // by call, as by key
    EXPECT_EQ(scrubber->focusedPart(), Handle::Playhead) << "the focus stays where it was";
    scrubber->setFrameDuration(0.5); // the property wins over the data source
    key(Qt::Key_Left);
    scrubber->setValue(0.0);
    key(Qt::Key_Left); // already at the start: nothing to report
    scrubber->setEditable(true);
    EXPECT_TRUE(scrubber->stepPart(Handle::End, -1, false)); // a handle begins editing
    EXPECT_EQ(client->names(),
              (kOneStep + kOneStep + kOneStep + kOneStep + QStringList{"beginEditing", "end"}));
    EXPECT_EQ(client->valuesOf("end"), Values{9.5});
    const Values values = client->valuesOf("value");
    ASSERT_EQ(values.size(), 4u);
    EXPECT_DOUBLE_EQ(values[0], 1.0);
    EXPECT_DOUBLE_EQ(values[1], 2.0);
    EXPECT_NEAR(values[2], 1.0, 1e-9);
    EXPECT_DOUBLE_EQ(values[3], 0.5);
}

TEST_F(ScrubberFixture, TabWalksThePartsAndArrowsMoveTheFocusedHandle) {
    scrubber->setEditable(true);
    client->frame = 0.5;
    scrubber->activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(scrubber.get()));
    scrubber->setFocus(Qt::OtherFocusReason);
    EXPECT_EQ(scrubber->focusedPart(), Handle::Playhead);

    key(Qt::Key_Tab);
    EXPECT_EQ(scrubber->focusedPart(), Handle::Start);
    key(Qt::Key_Right);
    EXPECT_TRUE(scrubber->isEditing());
    key(Qt::Key_Tab);
    EXPECT_EQ(scrubber->focusedPart(), Handle::End);
    key(Qt::Key_Left, Qt::ShiftModifier); // ten frames of 0.5 s
    key(Qt::Key_Home);                    // as close to the start as allowed
    key(Qt::Key_Backtab);
    key(Qt::Key_End); // the start cannot move: the minimum length holds it
    key(Qt::Key_Tab);
    key(Qt::Key_Tab); // past the last part, round to the first
    EXPECT_EQ(scrubber->focusedPart(), Handle::Playhead);
    EXPECT_EQ(client->names(), (QStringList{"beginEditing", "start", "end", "end"}));
    EXPECT_EQ(client->valuesOf("start"), Values{0.5});
    EXPECT_EQ(client->valuesOf("end"), (Values{5.0, 1.5}));
}

TEST_F(ScrubberFixture, AssistiveTechnologySeesASliderAtTheFocusedTime) {
    QAccessibleInterface* access = QAccessible::queryAccessibleInterface(scrubber.get());
    ASSERT_NE(access, nullptr);
    EXPECT_EQ(access->role(), QAccessible::Slider);
    EXPECT_EQ(access->text(QAccessible::Name), QStringLiteral("Movie scrubber"));
    scrubber->setValue(2.5);
    EXPECT_EQ(access->text(QAccessible::Value), QStringLiteral("Playhead 0:02.50"));
    QAccessibleValueInterface* value = access->valueInterface();
    ASSERT_NE(value, nullptr);
    EXPECT_EQ(value->maximumValue().toDouble(), 10.0);
    value->setCurrentValue(4.0);
    EXPECT_EQ(client->names(), kOneStep);
    EXPECT_EQ(value->currentValue().toDouble(), 4.0);
}

TEST_F(ScrubberFixture, TrimmingAHandleToATimeBeginsEditingAsAPressOnItDoes) {
    EXPECT_FALSE(scrubber->trimHandleTo(Handle::Start, 2.0)) << "not editable yet";
    scrubber->setEditable(true);
    EXPECT_FALSE(scrubber->trimHandleTo(Handle::Playhead, 2.0));
    EXPECT_TRUE(client->names().isEmpty());

    // The start is already at 0: editing begins all the same, nothing moves.
    EXPECT_TRUE(scrubber->trimHandleTo(Handle::Start, 0.0));
    EXPECT_TRUE(scrubber->isEditing());
    EXPECT_EQ(client->names(), QStringList{"beginEditing"});
    // Editing has begun; it does not begin again. The end keeps the least
    // length from the start (1 s by default).
    EXPECT_TRUE(scrubber->trimHandleTo(Handle::Start, 3.0));
    EXPECT_TRUE(scrubber->trimHandleTo(Handle::End, 3.5));
    EXPECT_EQ(client->names(), (QStringList{"beginEditing", "start", "end"}));
    EXPECT_EQ(client->valuesOf("start"), Values{3.0});
    EXPECT_EQ(client->valuesOf("end"), Values{4.0});

    // In the middle of a pointer gesture the hand has the handles.
    press(xAt(scrubber->endValue()) + 3);
    EXPECT_FALSE(scrubber->trimHandleTo(Handle::Start, 1.0));
    release(xAt(scrubber->endValue()) + 3);
    EXPECT_DOUBLE_EQ(scrubber->startValue(), 3.0);
}

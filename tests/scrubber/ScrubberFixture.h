#pragma once

#include "scrubber/RecordingScrubberClient.h"

#include <gtest/gtest.h>
#include <memory>

namespace testing_support {

// A shown 420 x 38 scrubber over a 10 s movie, with a recording client as
// delegate and data source. With the default inset of 10 the strip runs from
// x = 10 to x = 410: 40 px per second, time t at x = 10 + 40 t.
class ScrubberFixture : public ::testing::Test {
  protected:
    void SetUp() override;
    void TearDown() override;

    static double xAt(double seconds) { return 10.0 + 40.0 * seconds; }

    // Left-button mouse gestures at widget x (y in the middle).
    void press(double x);
    void move(double x);
    void release(double x);
    void drag(double from, double to); // press, one move, release
    void key(int key, Qt::KeyboardModifiers modifiers = Qt::NoModifier);
    // Gives the scrubber keyboard focus in an active window.
    void focus();

    std::shared_ptr<RecordingScrubberClient> client = std::make_shared<RecordingScrubberClient>();
    std::unique_ptr<platform::MovieScrubber> scrubber;
};

} // namespace testing_support

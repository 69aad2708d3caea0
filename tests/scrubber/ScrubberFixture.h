#pragma once

#include "scrubber/RecordingScrubberClient.h"
#include "ui/UiInput.h"

#include <gtest/gtest.h>
#include <memory>

namespace testing_support {

// A shown 420 x 38 scrubber over a 10 s movie, with a recording client as
// delegate and data source. With the default inset of 10 the strip runs from
// x = 10 to x = 410: 40 px per second, time t at x = 10 + 40 t.
class ScrubberFixture : public ::testing::Test {
  protected:
    void SetUp() override {
        scrubber->setDelegate(client);
        scrubber->setDataSource(client);
        scrubber->resize(420, 38);
        scrubber->show();
        scrubber->reloadData();
        client->calls.clear();
    }

    static double xAt(double seconds) { return 10.0 + 40.0 * seconds; }
    // Left-button mouse gestures at widget x (y in the middle), and keys.
    void press(double x) { ui_input::press(scrubber.get(), {x, 19}); }
    void move(double x) { ui_input::move(scrubber.get(), {x, 19}); }
    void release(double x) { ui_input::release(scrubber.get(), {x, 19}); }
    void drag(double from, double to) {
        press(from);
        move(to);
        release(to);
    }
    void key(int key, Qt::KeyboardModifiers modifiers = Qt::NoModifier) {
        ui_input::key(scrubber.get(), key, modifiers);
    }

    std::shared_ptr<RecordingScrubberClient> client = std::make_shared<RecordingScrubberClient>();
    std::unique_ptr<platform::MovieScrubber> scrubber = std::make_unique<platform::MovieScrubber>();
};

} // namespace testing_support

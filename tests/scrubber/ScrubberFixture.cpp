#include "scrubber/ScrubberFixture.h"

#include <QApplication>
#include <QKeyEvent>
#include <QMouseEvent>
#include <QTest>

namespace testing_support {

void ScrubberFixture::SetUp() {
    scrubber = std::make_unique<platform::MovieScrubber>();
    scrubber->setDelegate(client);
    scrubber->setDataSource(client);
    scrubber->resize(420, 38);
    scrubber->show();
    scrubber->reloadData();
    client->clear();
}

void ScrubberFixture::TearDown() {
    scrubber.reset();
}

namespace {

void sendMouse(QWidget* widget, QEvent::Type type, double x, Qt::MouseButtons buttons) {
    const QPointF local(x, 19.0);
    QMouseEvent event(type, local, widget->mapToGlobal(local), Qt::LeftButton, buttons,
                      Qt::NoModifier);
    QCoreApplication::sendEvent(widget, &event);
}

} // namespace

void ScrubberFixture::press(double x) {
    sendMouse(scrubber.get(), QEvent::MouseButtonPress, x, Qt::LeftButton);
}

void ScrubberFixture::move(double x) {
    sendMouse(scrubber.get(), QEvent::MouseMove, x, Qt::LeftButton);
}

void ScrubberFixture::release(double x) {
    sendMouse(scrubber.get(), QEvent::MouseButtonRelease, x, Qt::NoButton);
}

void ScrubberFixture::drag(double from, double to) {
    press(from);
    move(to);
    release(to);
}

void ScrubberFixture::key(int key, Qt::KeyboardModifiers modifiers) {
    QKeyEvent event(QEvent::KeyPress, key, modifiers);
    QCoreApplication::sendEvent(scrubber.get(), &event);
}

void ScrubberFixture::focus() {
    scrubber->activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(scrubber.get()));
    scrubber->setFocus(Qt::OtherFocusReason);
    ASSERT_TRUE(scrubber->hasFocus());
}

} // namespace testing_support

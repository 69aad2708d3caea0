#include "platform/ui/Button.h"
#include "platform/ui/Toolbar.h"
#include "platform/ui/ToolbarItemButton.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewHandle.h"
#include "ui/UiInput.h"

#include <QCoreApplication>
#include <QFocusEvent>
#include <QPainter>
#include <QPointer>
#include <gtest/gtest.h>

using namespace platform;

namespace {
void deleteDeferred() {
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
}
} // namespace

TEST(UiViewHandle, ARemovedViewLivesExactlyAsLongAsSomethingHoldsIt) {
    View root(QRectF(0, 0, 100, 100));
    QPointer<View> loose = new View();
    root.addSubview(loose);
    loose->removeFromSuperview();
    deleteDeferred();
    EXPECT_TRUE(loose.isNull()) << "nothing held it";

    ViewHandle<View> handle(new View());
    QPointer<View> held = handle.get();
    root.addSubview(held);
    held->removeFromSuperview();
    deleteDeferred();
    ASSERT_FALSE(held.isNull());
    ViewHandle<View> copy = handle;
    handle.reset();
    deleteDeferred();
    EXPECT_FALSE(held.isNull()) << "the copy still holds it";
    copy.reset();
    deleteDeferred();
    EXPECT_TRUE(held.isNull());

    // A view in a superview belongs to it as well: the superview's end is its end.
    ViewHandle<View> inTree;
    {
        View parent(QRectF(0, 0, 10, 10));
        inTree = ViewHandle<View>(new View());
        parent.addSubview(inTree.get());
    }
    EXPECT_FALSE(inTree);
}

TEST(UiButton, ControlEventsFollowThePressInOrder) {
    View root(QRectF(0, 0, 200, 200));
    auto* button = new Button(QRectF(50, 50, 40, 40));
    root.addSubview(button);
    root.show();
    QStringList events;
    const auto note = [&](const char* name) {
        return [&events, name](Button*) { events << name; };
    };
    button->addHandler(Button::ControlEvent::TouchDown, note("down"));
    button->addHandler(Button::ControlEvent::TouchDragInside, note("in"));
    button->addHandler(Button::ControlEvent::TouchDragOutside, note("out"));
    button->addHandler(Button::ControlEvent::TouchUpInside, note("up-in"));
    button->addHandler(Button::ControlEvent::TouchUpOutside, note("up-out"));
    button->addHandler(Button::ControlEvent::TouchCancel, note("cancel"));

    ui_input::press(button, {20, 20});
    EXPECT_TRUE(button->isDown());
    ui_input::move(button, {25, 20});
    ui_input::move(button, {90, 20});
    EXPECT_FALSE(button->isDown()) << "not highlighted while away";
    ui_input::release(button, {90, 20});
    ui_input::tap(button, {5, 5});
    EXPECT_EQ(events, (QStringList{"down", "in", "out", "up-out", "down", "up-in"}));

    events.clear();
    button->setFocus();
    ui_input::key(button, Qt::Key_Space);
    EXPECT_EQ(events, (QStringList{"down", "up-in"}));

    events.clear();
    ui_input::press(button, {20, 20});
    QFocusEvent away(QEvent::FocusOut, Qt::ActiveWindowFocusReason);
    QCoreApplication::sendEvent(button, &away);
    ui_input::release(button, {20, 20});
    EXPECT_EQ(events, (QStringList{"down", "cancel"}))
        << "a press cut off is cancelled, not completed";
}

TEST(UiToolbar, ImageInsetsMoveTheIcon) {
    View root(QRectF(0, 0, 300, 60));
    auto* bar = new Toolbar(QRectF(0, 0, 300, 60));
    root.addSubview(bar);
    auto plain = ToolbarItem::systemItem(ToolbarItem::SystemItem::Play);
    auto moved = ToolbarItem::systemItem(ToolbarItem::SystemItem::Play);
    moved->setImageInsets(QMarginsF(0, 8, 0, -8)); // left, top, right, bottom
    bar->setItems({plain, moved});
    bar->setTintColor(Qt::black);

    // The mean row of the icon's ink, in each button's own picture.
    const auto inkRow = [](QWidget* widget) {
        QImage image(widget->size(), QImage::Format_ARGB32_Premultiplied);
        image.fill(Qt::transparent);
        widget->render(&image, QPoint(), QRegion(), QWidget::RenderFlags());
        double sum = 0, count = 0;
        for (int y = 0; y < image.height(); ++y)
            for (int x = 0; x < image.width(); ++x)
                if (qAlpha(image.pixel(x, y)) > 128) {
                    sum += y;
                    ++count;
                }
        return count > 0 ? sum / count : -1.0;
    };
    const double plainRow = inkRow(bar->widgetForItem(plain.get()));
    const double movedRow = inkRow(bar->widgetForItem(moved.get()));
    ASSERT_GT(plainRow, 0);
    EXPECT_NEAR(movedRow - plainRow, 8.0, 1.0);
}

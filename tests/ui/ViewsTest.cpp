#include "platform/ui/Button.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewHandle.h"
#include "ui/UiInput.h"

#include <QCoreApplication>
#include <QFocusEvent>
#include <QPointer>
#include <gtest/gtest.h>

using namespace platform;

TEST(UiViewHandle, ARemovedViewLivesExactlyAsLongAsSomethingHoldsIt) {
    const auto gone = [](const QPointer<View>& view) {
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        return view.isNull();
    };
    View root(QRectF(0, 0, 100, 100));
    QPointer<View> loose = new View();
    root.addSubview(loose);
    loose->removeFromSuperview();
    EXPECT_TRUE(gone(loose)) << "nothing held it";

    ViewHandle<View> handle(new View());
    QPointer<View> held = handle.get();
    root.addSubview(held);
    held->removeFromSuperview();
    ASSERT_FALSE(gone(held));
    ViewHandle<View> copy = handle;
    handle.reset();
    EXPECT_FALSE(gone(held)) << "the copy still holds it";
    copy.reset();
    EXPECT_TRUE(gone(held));

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
    using Event = Button::ControlEvent;
    for (auto [event, name] : {std::pair{Event::TouchDown, "down"},
                               {Event::TouchDragInside, "in"},
                               {Event::TouchDragOutside, "out"},
                               {Event::TouchUpInside, "up-in"},
                               {Event::TouchUpOutside, "up-out"},
                               {Event::TouchCancel, "cancel"}})
        button->addHandler(event, [&events, name](Button*) { events << name; });

    ui_input::press(button, {20, 20});
    EXPECT_TRUE(button->isDown());
    ui_input::move(button, {25, 20});
    ui_input::move(button, {90, 20});
    EXPECT_FALSE(button->isDown()) << "not highlighted while away";
    ui_input::release(button, {90, 20});
    ui_input::tap(button, {5, 5});
    button->setFocus();
    ui_input::key(button, Qt::Key_Space);
    EXPECT_EQ(events,
              (QStringList{"down", "in", "out", "up-out", "down", "up-in", "down", "up-in"}));

    events.clear();
    ui_input::press(button, {20, 20});
    QFocusEvent away(QEvent::FocusOut, Qt::ActiveWindowFocusReason);
    QCoreApplication::sendEvent(button, &away);
    ui_input::release(button, {20, 20});
    EXPECT_EQ(events, (QStringList{"down", "cancel"}))
        << "a press cut off is cancelled, not completed";
}

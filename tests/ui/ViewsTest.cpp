#include "platform/ui/View.h"
#include "platform/ui/ViewHandle.h"

#include <QCoreApplication>
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

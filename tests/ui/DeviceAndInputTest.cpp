#include "platform/ui/BackdropView.h"
#include "platform/ui/Device.h"
#include "platform/ui/ImageView.h"
#include "platform/ui/TapRecognizer.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "ui/UiInput.h"

#include <QPainter>
#include <gtest/gtest.h>

using namespace platform;
using Idiom = Device::InterfaceIdiom;

TEST(UiDevice, IdiomAndGraphicsQualityComeFromTheDesktopUnlessForced) {
    testing_support::ScopedEnv env;
    env.unset("TAMSEL_DEVICE");
    EXPECT_EQ(Device::userInterfaceIdiom(), Idiom::Unspecified)
        << "a desktop has no idiom of its own";
    env.set("TAMSEL_DEVICE", "tablet");
    EXPECT_EQ(Device::userInterfaceIdiom(), Idiom::Pad);

    QStringList arguments{"app", "--device", "phone", "movie.mp4"};
    EXPECT_TRUE(Device::applyDeviceArgument(arguments));
    EXPECT_EQ(arguments, (QStringList{"app", "movie.mp4"}));
    EXPECT_EQ(Device::userInterfaceIdiom(), Idiom::Phone) << "the switch beats the environment";

    testing_support::LogCapture log;
    arguments = {"app", "--device=watch"};
    EXPECT_FALSE(Device::applyDeviceArgument(arguments));
    EXPECT_EQ(arguments, QStringList{"app"});
    EXPECT_EQ(log.lines().size(), 1);
    EXPECT_EQ(Device::userInterfaceIdiom(), Idiom::Phone);
    Device::setInterfaceIdiomOverride(std::nullopt);

    // The tests run on the offscreen platform, which renders in software.
    env.unset("TAMSEL_GRAPHICS_QUALITY");
    EXPECT_EQ(Device::graphicsQuality(), Device::SoftwareGraphicsQuality);
    env.set("TAMSEL_GRAPHICS_QUALITY", "100");
    EXPECT_EQ(Device::graphicsQuality(), 100);
}

TEST(UiTapRecognizer, ATapAnywhereInTheViewCountsAndADragDoesNot) {
    View root(QRectF(0, 0, 200, 200));
    auto* child = new View(QRectF(50, 50, 50, 50));
    root.addSubview(child);
    root.show();
    int taps = 0;
    auto* recognizer = new TapRecognizer(&root, [&](TapRecognizer*) { ++taps; });

    ui_input::tap(child, QPointF(10, 10));
    EXPECT_EQ(taps, 1);
    EXPECT_EQ(recognizer->locationInView(), QPointF(60, 60));

    ui_input::press(&root, QPointF(10, 10));
    ui_input::move(&root, QPointF(40, 10));
    ui_input::release(&root, QPointF(40, 10));
    recognizer->setEnabled(false);
    ui_input::tap(&root, QPointF(10, 10));
    EXPECT_EQ(taps, 1) << "a drag is not a tap, nor a tap on a disabled recognizer";
}

TEST(UiBackdrop, MaskViewsShapeTheBackdrop) {
    View root(QRectF(0, 0, 100, 100));
    auto* backdrop = new BackdropView(QRectF(0, 0, 100, 100));
    root.addSubview(backdrop);
    root.show();
    EXPECT_TRUE(backdrop->maskImage(1.0).isNull()) << "no masks: the whole bounds show";

    // A ring-shaped image: opaque outside a disc, as the overlay's mask is.
    QImage outside(100, 100, QImage::Format_ARGB32_Premultiplied);
    outside.fill(Qt::black);
    QPainter painter(&outside);
    painter.setCompositionMode(QPainter::CompositionMode_Clear);
    painter.setBrush(Qt::black);
    painter.drawEllipse(QRectF(0, 0, 100, 100));
    painter.end();
    auto* shape = new ImageView(outside);
    root.addSubview(shape);
    shape->setAlpha(0.0);
    backdrop->addMaskView(shape, BackdropView::MaskShape | BackdropView::MaskIgnoresAlpha |
                                     BackdropView::MaskInverted);

    EXPECT_EQ(qAlpha(backdrop->maskImage(1.0).pixel(50, 50)), 255);
    EXPECT_EQ(qAlpha(backdrop->maskImage(1.0).pixel(1, 1)), 0);

    // Without ignoring alpha, an invisible view adds nothing.
    backdrop->addMaskView(shape, BackdropView::MaskShape | BackdropView::MaskInverted);
    EXPECT_EQ(qAlpha(backdrop->maskImage(1.0).pixel(50, 50)), 0);
}

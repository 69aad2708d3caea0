#include "overlay/TXFlatVideoOverlayButton.h"
#include "overlay/TXHighFidelityVideoOverlayButton.h"
#include "overlay/ViewSRExtensions.h"
#include "platform/ui/Device.h"
#include "platform/ui/TapRecognizer.h"
#include "platform/ui/ViewAlpha.h"
#include "ui/UiInput.h"

#include <gtest/gtest.h>
#include <memory>

using platform::Device;
using platform::View;
using platform::ViewAlpha::alpha;

namespace {

class Target : public QObject {
    Q_OBJECT
  public:
    Q_INVOKABLE void playAction(QObject* sender) { senders.append(sender); }
    Q_INVOKABLE void plainAction() { ++plainCalls; }
    QList<QObject*> senders;
    int plainCalls = 0;
};

// A shown root view with the buttons in it, as the editor places them.
struct Stage {
    Stage() : root(QRectF(0, 0, 400, 300)) {
        root.show();
        root.addSubview(flat);
        root.addSubview(highFidelity);
        View::setFrameOf(flat, QRectF(100, 100, 80, 80));
        View::setFrameOf(highFidelity, QRectF(250, 100, 80, 80));
    }
    View root;
    TXFlatVideoOverlayButton* flat = new TXFlatVideoOverlayButton(2);
    TXHighFidelityVideoOverlayButton* highFidelity = new TXHighFidelityVideoOverlayButton(0);
};

QPointF centreOf(QWidget* w) {
    return QRectF(w->rect()).center();
}

} // namespace

TEST(UiOverlayFactory, PicksTheClassByStyleAndGraphicsQuality) {
    const struct {
        long style;
        int quality;
        bool flat;
    } cases[] = {
        {2, 100, true}, {2, 10, true},  {0, 10, true},  {0, 100, false},
        {0, 11, false}, {1, 10, false}, {3, 10, false}, {-1, 10, false},
    };
    for (const auto& c : cases) {
        Device::setGraphicsQualityOverride(c.quality);
        std::unique_ptr<TXVideoOverlayButton> button(
            ViewSRExtensions::_srVideoOverlayButtonWithStyle(c.style));
        Device::setGraphicsQualityOverride(std::nullopt);
        ASSERT_TRUE(button);
        EXPECT_EQ(dynamic_cast<TXFlatVideoOverlayButton*>(button.get()) != nullptr, c.flat)
            << "style " << c.style << " quality " << c.quality;
        EXPECT_EQ(dynamic_cast<TXHighFidelityVideoOverlayButton*>(button.get()) != nullptr,
                  !c.flat);
        EXPECT_EQ(button->style(), c.style);
    }
}

TEST(UiOverlayFactory, HighFidelityButtonIsTheGlyphsSizeWithABackdropOnlyForStyleZero) {
    TXHighFidelityVideoOverlayButton automatic(0);
    EXPECT_EQ(automatic.frame().size(), QSizeF(80, 80));
    ASSERT_NE(automatic.backdropView(), nullptr);
    EXPECT_EQ(automatic.backdropView()->parentWidget(), &automatic);
    EXPECT_LT(automatic.children().indexOf(automatic.backdropView()),
              automatic.children().indexOf(automatic.button()))
        << "the backdrop lies under the glyph";
    EXPECT_EQ(TXHighFidelityVideoOverlayButton(1).backdropView(), nullptr);
    EXPECT_DOUBLE_EQ(alpha(automatic.button()), 0.3);
}

TEST(UiOverlayButton, HighFidelityGlyphFollowsThePressAndATapSendsTheOverlayView) {
    Stage stage;
    Target target;
    stage.highFidelity->setTarget_action(&target, "playAction");
    QWidget* inner = stage.highFidelity->button();
    const QPointF outside(-40, -40);

    ui_input::press(inner, centreOf(inner));
    EXPECT_DOUBLE_EQ(alpha(inner), 0.5);
    ui_input::move(inner, outside);
    EXPECT_DOUBLE_EQ(alpha(inner), 0.3);
    ui_input::move(inner, centreOf(inner));
    EXPECT_DOUBLE_EQ(alpha(inner), 0.5);
    // Released outside after coming back in: nothing rests the glyph.
    ui_input::release(inner, outside);
    EXPECT_DOUBLE_EQ(alpha(inner), 0.5);
    EXPECT_TRUE(target.senders.isEmpty());

    ui_input::tap(inner);
    EXPECT_EQ(target.senders, QList<QObject*>{stage.highFidelity});
    EXPECT_DOUBLE_EQ(alpha(inner), 0.3);
}

TEST(UiOverlayButton, FlatTapSendsTheButtonAndHighlightsWhilePressed) {
    Stage stage;
    Target target;
    stage.flat->setTarget_action(&target, "playAction");
    ui_input::press(stage.flat, centreOf(stage.flat));
    EXPECT_EQ(stage.flat->currentImage().cacheKey(),
              TXFlatVideoOverlayButton::_highlightedButtonImage().cacheKey());
    ui_input::release(stage.flat, centreOf(stage.flat));
    EXPECT_EQ(stage.flat->currentImage().cacheKey(),
              TXFlatVideoOverlayButton::_normalButtonImage().cacheKey());
    EXPECT_EQ(target.senders, QList<QObject*>{stage.flat});
    EXPECT_EQ(TXFlatVideoOverlayButton(0).size(), QSize(80, 80)) << "the image's size";
}

TEST(UiOverlayButton, ATargetGoneOrNotRespondingIsLeftAloneAndTheSuperviewHearsNoTap) {
    Stage stage;
    int taps = 0;
    new platform::TapRecognizer(&stage.root, [&](platform::TapRecognizer*) { ++taps; });
    {
        Target target;
        stage.highFidelity->setTarget_action(&target, "playAction");
        stage.flat->setTarget_action(&target, "playAction");
    }
    ui_input::tap(stage.highFidelity->button());
    ui_input::tap(stage.flat);
    EXPECT_EQ(stage.highFidelity->target(), nullptr);
    EXPECT_EQ(stage.flat->target(), nullptr);

    Target other;
    stage.flat->setTarget_action(&other, "noSuchAction");
    ui_input::tap(stage.flat);
    // A method without the sender parameter is called without it.
    stage.flat->setTarget_action(&other, "plainAction");
    ui_input::tap(stage.flat);
    EXPECT_EQ(other.plainCalls, 1);
    EXPECT_TRUE(other.senders.isEmpty());

    EXPECT_EQ(taps, 0) << "presses on the buttons stay theirs";
    ui_input::tap(&stage.root, QPointF(10, 10));
    EXPECT_EQ(taps, 1);
}

#include "OverlayButtonTest.moc"

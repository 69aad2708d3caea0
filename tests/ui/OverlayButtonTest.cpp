#include "overlay/TXFlatVideoOverlayButton.h"
#include "overlay/TXHighFidelityVideoOverlayButton.h"
#include "overlay/ViewSRExtensions.h"
#include "platform/ui/Device.h"
#include "platform/ui/TapRecognizer.h"
#include "platform/ui/ViewAlpha.h"
#include "ui/UiInput.h"

#include <QPointer>
#include <gtest/gtest.h>
#include <memory>

using platform::Device;
using platform::View;
using platform::ViewAlpha::alpha;

namespace {

class SenderTarget : public QObject {
    Q_OBJECT
  public:
    Q_INVOKABLE void playAction(QObject* sender) { senders.append(sender); }
    QList<QObject*> senders;
};

class PlainTarget : public QObject {
    Q_OBJECT
  public:
    Q_INVOKABLE void playAction() { ++calls; }
    int calls = 0;
};

class QualityOverride {
  public:
    explicit QualityOverride(int quality) { Device::setGraphicsQualityOverride(quality); }
    ~QualityOverride() { Device::setGraphicsQualityOverride(std::nullopt); }
};

// A shown root view with the button in it, as the editor places it.
struct Stage {
    Stage() : root(QRectF(0, 0, 400, 300)) { root.show(); }
    template <class Button> Button* add(Button* button) {
        root.addSubview(button);
        View::setFrameOf(button, QRectF(QPointF(100, 100), View::frameOf(button).size()));
        return button;
    }
    View root;
};

QPointF centreOf(QWidget* w) {
    return QRectF(w->rect()).center();
}

} // namespace

TEST(UiOverlayFactory, PicksTheClassByStyleAndGraphicsQuality) {
    struct Case {
        long style;
        int quality;
        bool flat;
    };
    const Case cases[] = {
        {2, 100, true}, {2, 10, true},  {0, 10, true},  {0, 100, false},
        {0, 11, false}, {1, 10, false}, {3, 10, false}, {-1, 10, false},
    };
    for (const Case& c : cases) {
        QualityOverride quality(c.quality);
        std::unique_ptr<TXVideoOverlayButton> button(
            ViewSRExtensions::_srVideoOverlayButtonWithStyle(c.style));
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
    TXHighFidelityVideoOverlayButton plain(1);

    EXPECT_EQ(automatic.frame().size(), QSizeF(80, 80));
    EXPECT_EQ(automatic.button()->geometry(), QRect(0, 0, 80, 80));
    ASSERT_NE(automatic.backdropView(), nullptr);
    EXPECT_EQ(automatic.backdropView()->parentWidget(), &automatic);
    // The backdrop lies under the glyph.
    EXPECT_LT(automatic.children().indexOf(automatic.backdropView()),
              automatic.children().indexOf(automatic.button()));
    EXPECT_EQ(plain.backdropView(), nullptr);
    EXPECT_DOUBLE_EQ(alpha(automatic.button()), 0.3);
    EXPECT_EQ(automatic.autoresizingMask(), View::FlexibleLeftMargin | View::FlexibleRightMargin |
                                                View::FlexibleTopMargin |
                                                View::FlexibleBottomMargin);
}

TEST(UiOverlayButton, HighFidelityTapSendsTheOverlayViewAndRestsTheGlyph) {
    Stage stage;
    auto* overlay = stage.add(new TXHighFidelityVideoOverlayButton(0));
    SenderTarget target;
    overlay->setTarget_action(&target, "playAction");
    QWidget* inner = overlay->button();

    ui_input::press(inner, centreOf(inner));
    EXPECT_DOUBLE_EQ(alpha(inner), 0.5);
    ui_input::release(inner, centreOf(inner));

    ASSERT_EQ(target.senders.size(), 1);
    EXPECT_EQ(target.senders.first(), overlay);
    EXPECT_DOUBLE_EQ(alpha(inner), 0.3);
}

TEST(UiOverlayButton, HighFidelityGlyphFollowsThePressInAndOut) {
    Stage stage;
    auto* overlay = stage.add(new TXHighFidelityVideoOverlayButton(1));
    SenderTarget target;
    overlay->setTarget_action(&target, "playAction");
    QWidget* inner = overlay->button();
    const QPointF outside(-40, -40);

    ui_input::press(inner, centreOf(inner));
    ui_input::move(inner, outside);
    EXPECT_DOUBLE_EQ(alpha(inner), 0.3);
    ui_input::move(inner, centreOf(inner));
    EXPECT_DOUBLE_EQ(alpha(inner), 0.5);
    // Released outside after coming back in: nothing rests the glyph.
    ui_input::release(inner, outside);
    EXPECT_DOUBLE_EQ(alpha(inner), 0.5);
    EXPECT_TRUE(target.senders.isEmpty());
}

TEST(UiOverlayButton, FlatTapSendsTheButtonAndHighlightsWhilePressed) {
    Stage stage;
    auto* flat = stage.add(new TXFlatVideoOverlayButton(2));
    SenderTarget target;
    flat->setTarget_action(&target, "playAction");

    ui_input::press(flat, centreOf(flat));
    EXPECT_EQ(flat->currentImage().cacheKey(),
              TXFlatVideoOverlayButton::_highlightedButtonImage().cacheKey());
    ui_input::release(flat, centreOf(flat));
    EXPECT_EQ(flat->currentImage().cacheKey(),
              TXFlatVideoOverlayButton::_normalButtonImage().cacheKey());
    ASSERT_EQ(target.senders.size(), 1);
    EXPECT_EQ(target.senders.first(), flat);
}

TEST(UiOverlayButton, ATargetThatIsGoneOrDoesNotRespondIsLeftAlone) {
    Stage stage;
    auto* highFidelity = stage.add(new TXHighFidelityVideoOverlayButton(0));
    auto* flat = stage.add(new TXFlatVideoOverlayButton(2));
    {
        auto target = std::make_unique<SenderTarget>();
        highFidelity->setTarget_action(target.get(), "playAction");
        flat->setTarget_action(target.get(), "playAction");
    }
    ui_input::tap(highFidelity->button());
    ui_input::tap(flat);
    EXPECT_EQ(highFidelity->target(), nullptr);
    EXPECT_EQ(flat->target(), nullptr);

    PlainTarget other;
    flat->setTarget_action(&other, "noSuchAction");
    ui_input::tap(flat);
    EXPECT_EQ(other.calls, 0);
    // A method without the sender parameter is called without it.
    flat->setTarget_action(&other, "playAction");
    ui_input::tap(flat);
    EXPECT_EQ(other.calls, 1);
}

TEST(UiOverlayButton, PressesOnTheButtonsDoNotReachTheSuperviewsTapRecognizer) {
    Stage stage;
    auto* flat = stage.add(new TXFlatVideoOverlayButton(2));
    auto* highFidelity = stage.add(new TXHighFidelityVideoOverlayButton(0));
    View::setFrameOf(highFidelity, QRectF(250, 100, 80, 80));
    int taps = 0;
    new platform::TapRecognizer(&stage.root, [&](platform::TapRecognizer*) { ++taps; });

    ui_input::tap(flat);
    ui_input::tap(highFidelity->button());
    EXPECT_EQ(taps, 0);
    ui_input::tap(&stage.root, QPointF(10, 10));
    EXPECT_EQ(taps, 1);
}

#include "OverlayButtonTest.moc"

#include "GalleryViewController.h"

#include "GalleryMovieSource.h"
#include "overlay/TXFlatVideoOverlayButton.h"
#include "overlay/TXHighFidelityVideoOverlayButton.h"
#include "overlay/ViewSRExtensions.h"
#include "platform/ui/Alert.h"
#include "platform/ui/Animation.h"
#include "platform/ui/BackdropView.h"
#include "platform/ui/Device.h"
#include "platform/ui/ImageView.h"
#include "platform/ui/Label.h"
#include "platform/ui/TapRecognizer.h"
#include "platform/ui/scrubber/MovieScrubber.h"
#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include <QDateTime>
#include <QLinearGradient>
#include <QPainter>

using namespace platform;

namespace {

constexpr qreal kTopBarHeight = 60.0;
constexpr qreal kBottomBarHeight = 44.0;
constexpr qreal kScrubberHeight = 38.0;
constexpr qreal kPanelWidth = 280.0;
constexpr qreal kPanelHeight = 200.0;

// A stand-in picture when no movie could be made: a sky with hills.
QImage drawnPicture() {
    QImage image(640, 360, QImage::Format_ARGB32_Premultiplied);
    QPainter painter(&image);
    QLinearGradient sky(0, 0, 0, 360);
    sky.setColorAt(0, QColor(70, 120, 200));
    sky.setColorAt(1, QColor(230, 180, 120));
    painter.fillRect(image.rect(), sky);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setBrush(QColor(60, 120, 70));
    painter.setPen(Qt::NoPen);
    painter.drawEllipse(QRectF(-100, 250, 500, 260));
    painter.setBrush(QColor(40, 95, 60));
    painter.drawEllipse(QRectF(260, 270, 520, 240));
    return image;
}

} // namespace

GalleryViewController::GalleryViewController() : source_(std::make_shared<GalleryMovieSource>()) {
    source_->onReport = [this](const QString& line) {
        report(QStringLiteral("Scrubber: ") + line);
    };
}

GalleryViewController::~GalleryViewController() = default;

bool GalleryViewController::isSettled() const {
    const bool thumbnails = !source_->hasMovie() || source_->thumbnailsComplete();
    const bool spinner = progress_ && progress_->activityIndicator();
    return thumbnails && spinner;
}

void GalleryViewController::report(const QString& line) {
    lastReport_ = line;
    if (status_)
        status_->setText(line);
}

void GalleryViewController::loadView() {
    auto* root = new View(QRectF(0, 0, 1000, 700));
    root->setBackgroundColor(QColor(30, 30, 34));
    setView(root);
    buildPicture();
    buildScrubber();
    buildToolbars();
    if (!source_->hasMovie())
        report(QStringLiteral("No movie: %1").arg(source_->error()));
    else
        report(QStringLiteral(
            "Tab moves between controls; Ctrl+Z shakes; a tap on the picture hides the bars"));
}

void GalleryViewController::buildToolbars() {
    View* root = view();
    QPointer<GalleryViewController> self(this);
    auto act = [self](void (GalleryViewController::*method)()) {
        return [self, method] {
            if (self)
                (self.data()->*method)();
        };
    };
    auto say = [self](const QString& text) {
        return [self, text] {
            if (self)
                self->report(text);
        };
    };

    share_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Action,
                                     act(&GalleryViewController::presentPopover));
    play_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Play, [self] {
        if (self)
            self->showPlaying(true);
    });
    pause_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Pause, [self] {
        if (self)
            self->showPlaying(false);
    });
    undo_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Undo, say(QStringLiteral("Undo")));
    done_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Done,
                                    act(&GalleryViewController::presentAlert));
    cancel_ =
        ToolbarItem::systemItem(ToolbarItem::SystemItem::Cancel, say(QStringLiteral("Cancel")));
    save_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Save, say(QStringLiteral("Save")));
    cancelTrim_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Cancel,
                                          say(QStringLiteral("Cancel trim")));
    trimDone_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Done, say(QStringLiteral("Trim")));
    wideShare_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Action,
                                         act(&GalleryViewController::presentPopover));
    widePlay_ = ToolbarItem::systemItem(ToolbarItem::SystemItem::Play, [self] {
        if (self)
            self->showPlaying(true);
    });
    widePlay_->setImageInsets(QMarginsF(0, 8, 0, -8));
    wideShare_->setImageInsets(QMarginsF(0, 5, 0, -5));
    flex_ = ToolbarItem::flexibleSpace();
    fixed_ = ToolbarItem::fixedSpace(16);

    // The title: a name with a date line beneath that reaches past the
    // label's own height.
    auto* title = new Label(QRectF(0, 0, 160, 17));
    title->setSystemFontOfSize(15);
    title->setText(QStringLiteral("Tamsel gallery"));
    title->setTextAlignment(Qt::AlignCenter);
    title->setClipsToBounds(false);
    auto* date = new Label(QRectF(0, 17, 160, 17));
    date->setSystemFontOfSize(10);
    date->setText(QLocale().toString(QDateTime::currentDateTime(), QLocale::ShortFormat));
    date->setTextAlignment(Qt::AlignCenter);
    title->addSubview(date);
    title_ = ToolbarItem::customViewItem(title);

    const qreal width = root->bounds().width();
    topBar_ = new Toolbar(QRectF(0, 0, width, kTopBarHeight));
    topBar_->setAutoresizingMask(View::FlexibleWidth);
    topBar_->setTintColor(QColor(225, 110, 20));
    root->addSubview(topBar_);
    topBar_->setItems({cancel_, flex_, title_, flex_, save_});

    wideBar_ = new Toolbar(QRectF(0, kTopBarHeight, width, kTopBarHeight));
    wideBar_->setAutoresizingMask(View::FlexibleWidth);
    root->addSubview(wideBar_);
    wideBar_->setItems({cancelTrim_, flex_, widePlay_, fixed_, wideShare_, fixed_, trimDone_});

    bottomBar_ =
        new Toolbar(QRectF(0, root->bounds().height() - kBottomBarHeight, width, kBottomBarHeight));
    bottomBar_->setAutoresizingMask(View::FlexibleWidth | View::FlexibleTopMargin);
    root->addSubview(bottomBar_);
    showPlaying(false);

    std::weak_ptr<ToolbarDelegate> delegate =
        std::static_pointer_cast<GalleryViewController>(shared_from_this());
    for (Toolbar* bar : {topBar_, wideBar_, bottomBar_})
        bar->setDelegate(delegate);

    // The scrubber strip sits on the bottom bar, full width.
    root->addConstraints({
        LayoutConstraint::make(scrubberContainer_, LayoutAttribute::Leading, root,
                               LayoutAttribute::Leading),
        LayoutConstraint::make(scrubberContainer_, LayoutAttribute::Trailing, root,
                               LayoutAttribute::Trailing),
        LayoutConstraint::make(scrubberContainer_, LayoutAttribute::Bottom, bottomBar_,
                               LayoutAttribute::Top),
        LayoutConstraint::constantSize(scrubberContainer_, LayoutAttribute::Height,
                                       kScrubberHeight),
    });
}

void GalleryViewController::buildPicture() {
    View* root = view();
    QImage frame = source_->frameAt(2.0);
    if (frame.isNull())
        frame = drawnPicture();
    picture_ = new ImageView(frame);
    picture_->setAccessibleName(QStringLiteral("Movie picture"));
    root->addSubview(picture_);
    QPointer<GalleryViewController> self(this);
    new TapRecognizer(picture_, [self](TapRecognizer*) {
        if (self)
            self->toggleChrome();
    });

    // Both classes side by side, and what the factory picks here.
    TXVideoOverlayButton* buttons[] = {
        new TXHighFidelityVideoOverlayButton(0),
        new TXHighFidelityVideoOverlayButton(1),
        new TXFlatVideoOverlayButton(2),
        ViewSRExtensions::_srVideoOverlayButtonWithStyle(0),
    };
    const QString captions[] = {
        QStringLiteral("high fidelity, style 0"),
        QStringLiteral("high fidelity, style 1"),
        QStringLiteral("flat, style 2"),
        QStringLiteral("factory, style 0 (quality %1)").arg(Device::graphicsQuality()),
    };
    for (int i = 0; i < 4; ++i) {
        buttons[i]->setTarget_action(this, "overlayTapped");
        QWidget* widget = buttons[i]->view();
        widget->setProperty("galleryCaption", captions[i]);
        root->addSubview(widget);
        overlayButtons_.append(widget);
        auto* caption = new Label(QRectF(0, 0, 200, 16));
        caption->setSystemFontOfSize(12);
        caption->setTextColor(Qt::white);
        caption->setTextAlignment(Qt::AlignCenter);
        caption->setText(captions[i]);
        root->addSubview(caption);
        overlayCaptions_.append(caption);
    }

    publishingPanel_ = new View();
    publishingPanel_->setBackgroundColor(QColor(245, 245, 245));
    auto* panelTitle = new Label(QRectF(12, 10, 240, 20));
    panelTitle->setText(QStringLiteral("Publishing to YouTube"));
    publishingPanel_->addSubview(panelTitle);
    root->addSubview(publishingPanel_);
    progress_ = new TXYouTubeActivityProgressOverlay(QRectF(0, 0, kPanelWidth, kPanelHeight));
    publishingPanel_->addSubview(progress_);
    progress_->setShowing_animated(true, true);

    status_ = new Label(QRectF(0, 0, 600, 20));
    status_->setSystemFontOfSize(13);
    status_->setTextColor(QColor(240, 240, 240));
    root->addSubview(status_);
}

void GalleryViewController::buildScrubber() {
    View* root = view();
    scrubberContainer_ = new BackdropView(QRectF(), 2010);
    scrubberContainer_->setTranslatesAutoresizingMaskIntoConstraints(false);
    root->addSubview(scrubberContainer_);
    scrubber_ = new MovieScrubber(scrubberContainer_);
    View::setAutoresizingMaskOf(scrubber_, View::FlexibleWidth | View::FlexibleHeight);
    scrubber_->setMinimumTrimLength(1.0);
    scrubber_->setEditable(true);
    scrubber_->setZoomDelay(0.5);
    scrubber_->setEdgeInset(10.0f);
    scrubber_->setDelegate(source_);
    scrubber_->setDataSource(source_);
    connect(scrubberContainer_, &View::didLayoutSubviews, this,
            [this] { View::setFrameOf(scrubber_, scrubberContainer_->bounds()); });
}

void GalleryViewController::viewDidLayoutSubviews() {
    View* root = view();
    const QRectF bounds = root->bounds();
    const qreal top = 2 * kTopBarHeight;
    const qreal bottom = bounds.height() - kBottomBarHeight - kScrubberHeight;
    const QRectF area(0, top, bounds.width(), std::max(0.0, bottom - top));
    if (scrubber_ && scrubberContainer_)
        View::setFrameOf(scrubber_, scrubberContainer_->bounds());

    // The picture fills the area's left part, keeping its shape.
    const QSizeF image = picture_->image().deviceIndependentSize();
    const qreal panelWidth = kPanelWidth;
    QRectF pictureArea = area.adjusted(12, 12, -panelWidth - 24, -36);
    QSizeF fitted = image.scaled(pictureArea.size(), Qt::KeepAspectRatio);
    QRectF pictureFrame(QPointF(0, 0), fitted);
    pictureFrame.moveCenter(pictureArea.center());
    picture_->setFrame(pictureFrame);

    const int count = int(overlayButtons_.size());
    for (int i = 0; i < count; ++i) {
        QWidget* button = overlayButtons_[i];
        const QSizeF size = View::frameOf(button).size();
        const qreal column = pictureFrame.left() + pictureFrame.width() * (i + 0.5) / count;
        const QPointF centre(column, pictureFrame.center().y());
        View::setFrameOf(button,
                         QRectF(centre - QPointF(size.width() / 2, size.height() / 2), size));
        overlayCaptions_[i]->setFrame(
            QRectF(column - 100, centre.y() + size.height() / 2 + 6, 200, 16));
    }

    publishingPanel_->setFrame(
        QRectF(area.right() - panelWidth - 12, area.top() + 12, panelWidth, kPanelHeight));
    status_->setFrame(QRectF(12, area.bottom() - 26, area.width() - 24, 20));
}

void GalleryViewController::viewWillAppear(bool animated) {
    becomeFirstResponder();
    ViewController::viewWillAppear(animated);
}

void GalleryViewController::viewDidAppear(bool animated) {
    ViewController::viewDidAppear(animated);
    // The strip knows how many thumbnails fit once it has its width.
    view()->layoutIfNeeded();
    scrubber_->reloadData();
}

void GalleryViewController::viewWillTransitionToSize_withTransitionCoordinator(
    const QSizeF& size, TransitionCoordinator& coordinator) {
    ViewController::viewWillTransitionToSize_withTransitionCoordinator(size, coordinator);
    QPointer<GalleryViewController> self(this);
    coordinator.animateAlongsideTransition_completion(
        [self](TransitionCoordinator&) {
            if (!self)
                return;
            const QRectF bounds = self->view()->bounds();
            self->report(
                QStringLiteral("Window is now %1 x %2").arg(bounds.width()).arg(bounds.height()));
            self->scrubber_->reloadData();
        },
        {});
}

void GalleryViewController::motionEnded_withEvent(MotionEvent::Subtype motion,
                                                  const MotionEvent& event) {
    if (motion == MotionEvent::Subtype::MotionShake)
        report(QStringLiteral("Shake at %1 s").arg(event.timestamp, 0, 'f', 2));
    ViewController::motionEnded_withEvent(motion, event);
}

BarPosition GalleryViewController::positionForBar(Toolbar& bar) {
    return &bar == bottomBar_ ? BarPosition::Bottom : BarPosition::Top;
}

void GalleryViewController::overlayTapped(QObject* sender) {
    report(QStringLiteral("Overlay button tapped: %1")
               .arg(sender->property("galleryCaption").toString()));
}

void GalleryViewController::showPlaying(bool playing) {
    bottomBar_->setItems({share_, flex_, playing ? pause_ : play_, flex_, undo_});
    report(playing ? QStringLiteral("Playing") : QStringLiteral("Paused"));
}

void GalleryViewController::toggleChrome() {
    chromeHidden_ = !chromeHidden_;
    const qreal alpha = chromeHidden_ ? 0.0 : 1.0;
    Animation::animateWithDuration(0.25, [this, alpha] {
        for (View* bar : {static_cast<View*>(topBar_), static_cast<View*>(wideBar_),
                          static_cast<View*>(bottomBar_), static_cast<View*>(scrubberContainer_)})
            bar->setAlpha(alpha);
    });
}

void GalleryViewController::presentPopover() {
    auto sheet = std::make_shared<ViewController>();
    View* content = sheet->view();
    content->setBackgroundColor(QColor(252, 252, 252));
    auto* text = new Label(QRectF(16, 16, 260, 22));
    text->setText(QStringLiteral("A popover at the share item"));
    content->addSubview(text);
    sheet->setModalPresentationStyle(ViewController::ModalPresentationStyle::Popover);
    sheet->setPreferredContentSize(QSizeF(300, 120));
    sheet->setPopoverItem(bottomBar_->widgetForItem(share_.get()) ? share_ : wideShare_);
    presentViewController_animated_completion(sheet, true);
    report(QStringLiteral("Popover shown; a click outside closes it"));
}

void GalleryViewController::presentAlert() {
    auto alert = Alert::make(QStringLiteral("Published"), QStringLiteral("The video is online."));
    QPointer<GalleryViewController> self(this);
    alert->addAction(AlertAction::make(QStringLiteral("View on YouTube"),
                                       AlertAction::Style::Default, [self](AlertAction&) {
                                           if (self)
                                               self->report(QStringLiteral("Alert: view"));
                                       }));
    alert->addAction(AlertAction::make(QStringLiteral("Close"), AlertAction::Style::Cancel,
                                       [self](AlertAction&) {
                                           if (self)
                                               self->report(QStringLiteral("Alert: close"));
                                       }));
    presentViewController_animated_completion(alert, true);
}

// The editor's model: construction and tear-down.

#include "TXVideoEditorViewController.h"

#include "overlay/TXVideoOverlayButton.h"
#include "overlay/ViewSRExtensions.h"
#include "platform/media/playback/NotificationCenter.h"
#include "platform/ui/Device.h"
#include "platform/ui/Screen.h"
#include "platform/ui/TapRecognizer.h"
#include "support/DateTXExtensions.h"
#include "support/FileManager.h"

using namespace platform;

namespace {
// How often the playhead follows playback: 1/30 s at a nanosecond timescale.
const MediaTime kPlayheadInterval = MediaTime::fromSeconds(0.033333333333333333, 1000000000);
} // namespace

std::shared_ptr<TXVideoEditorViewController>
TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName_overrideTintColor(
    const QString& bundleIdentifier, const QUrl& url, const QString& applicationName,
    const QColor& overrideTintColor) {
    auto editor = std::shared_ptr<TXVideoEditorViewController>(new TXVideoEditorViewController);
    editor->init(bundleIdentifier, url, applicationName, overrideTintColor);
    return editor;
}

std::shared_ptr<TXVideoEditorViewController>
TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName(
    const QString& bundleIdentifier, const QUrl& url, const QString& applicationName) {
    return initWithBundleIdentifier_URL_applicationName_overrideTintColor(
        bundleIdentifier, url, applicationName, QColor());
}

std::shared_ptr<TXVideoEditorViewController> TXVideoEditorViewController::self() {
    return std::static_pointer_cast<TXVideoEditorViewController>(shared_from_this());
}

std::weak_ptr<TXVideoEditorViewController> TXVideoEditorViewController::weakSelf() {
    return self();
}

void TXVideoEditorViewController::loadView() {
    // The editor fills whatever holds it, starting at the main screen's size.
    auto* root = new View(Screen::mainScreen().bounds());
    root->setAutoresizingMask(View::FlexibleWidth | View::FlexibleHeight);
    setView(root);
}

void TXVideoEditorViewController::init(const QString& bundleIdentifier, const QUrl& url,
                                       const QString& applicationName,
                                       const QColor& overrideTintColor) {
    // 1. Base state.
    activityTypes = QStringList();
    setHasEdit(false);
    View* root = view();

    // 2. The tap surface over the video.
    videoOverlay = new View(root->bounds());
    setUiHidden(false);
    new TapRecognizer(videoOverlay.get(), [weak = weakSelf()](TapRecognizer* recognizer) {
        if (auto editor = weak.lock())
            editor->handleSingleTap(recognizer);
    });

    // 3. The big play button, centred on the screen.
    videoOverlayPlayButton = ViewSRExtensions::_srVideoOverlayButtonWithStyle(0);
    videoOverlayPlayButtonView = videoOverlayPlayButton->view();
    {
        QWidget* button = videoOverlayPlayButton->view();
        const QRectF screen = Screen::mainScreen().bounds();
        const QSizeF size = View::frameOf(button).size();
        View::setFrameOf(button, QRectF(QPointF(screen.width() * 0.5 - size.width() * 0.5,
                                                screen.height() * 0.5 - size.height() * 0.5),
                                        size));
        // The main screen is the window, which the user resizes: margins that
        // share the change keep the button where it was put, in the middle.
        View::setAutoresizingMaskOf(button, View::FlexibleLeftMargin | View::FlexibleRightMargin |
                                                View::FlexibleTopMargin |
                                                View::FlexibleBottomMargin);
        videoOverlayPlayButton->setTarget_action(this, QByteArrayLiteral("playAction"));
    }

    // 4. Inputs.
    setIntroMode(true);
    originalVideoURL = url;
    videoURL = url;
    this->applicationName = applicationName;
    this->bundleIdentifier = bundleIdentifier;

    // 5. Title: the name with the recording's date beneath it.
    titleLabel = new Label(QRectF(0, 0, 120, 17));
    titleLabel->setSystemFontOfSize(15);
    titleLabel->setBackgroundColor(QColor());
    titleLabel->setTextColor(Qt::black);
    titleLabel->setText(applicationName);
    titleLabel->setTextAlignment(Qt::AlignCenter);
    titleLabel->setClipsToBounds(false);
    auto* dateLabel = new Label(QRectF(0, 17, 120, 17));
    dateLabel->setBackgroundColor(QColor());
    dateLabel->setSystemFontOfSize(10);
    dateLabel->setTextColor(Qt::black);
    dateLabel->setTextAlignment(Qt::AlignCenter);
    dateLabel->setText(DateTXExtensions::_srGetStringFromDate(
        FileManager::defaultManager()->_srGetCreationDateForFile(url)));
    titleLabel->addSubview(dateLabel);
    titleButton = ToolbarItem::customViewItem(titleLabel);

    // 6. Where a trimmed clip goes.
    trimFilePath = trimFileURL();
    setTrimming(false);
    setExporting(false);

    // 7. Playback objects.
    avAsset = Asset::assetWithURL(url);
    avPlayerItem = PlayerItem::playerItemWithAsset(avAsset);
    avPlayer = Player::playerWithPlayerItem(avPlayerItem);
    avPlayer->seekToTime(MediaTime::zero());
    observeEndOfPlay();
    avPlayerLayer = PlayerLayer::playerLayerWithPlayer(avPlayer);
    addStatusObserver();

    // 8. The scrubber in its blurred container.
    scrubberContainterView = new BackdropView(QRectF(), 2010);
    scrubberContainterView->setUserInteractionEnabled(true);
    scrubberContainterView->setTranslatesAutoresizingMaskIntoConstraints(false);
    avTrimmer = new MovieScrubber();
    View::setFrameOf(avTrimmer.get(), scrubberContainterView->bounds());
    View::setAutoresizingMaskOf(avTrimmer.get(), View::FlexibleWidth | View::FlexibleHeight);
    avTrimmer->setMinimumTrimLength(1.0);
    avTrimmer->setEditable(true);
    avTrimmer->setZoomDelay(0.5);
    avTrimmer->setEdgeInset(10.0f);
    setScrubbing(false);
    addPeriodicPlayheadObserver();

    // 9. Toolbar buttons, all aimed at the editor.
    auto action = [weak = weakSelf()](void (TXVideoEditorViewController::*method)()) {
        return [weak, method] {
            if (auto editor = weak.lock())
                (editor.get()->*method)();
        };
    };
    using Kind = ToolbarItem::SystemItem;
    shareButton =
        ToolbarItem::systemItem(Kind::Action, action(&TXVideoEditorViewController::shareAction));
    undoButton =
        ToolbarItem::systemItem(Kind::Undo, action(&TXVideoEditorViewController::undoAction));
    pauseButton =
        ToolbarItem::systemItem(Kind::Pause, action(&TXVideoEditorViewController::pauseAction));
    playButton =
        ToolbarItem::systemItem(Kind::Play, action(&TXVideoEditorViewController::playAction));
    doneButton =
        ToolbarItem::systemItem(Kind::Done, action(&TXVideoEditorViewController::doneAction));
    saveButton =
        ToolbarItem::systemItem(Kind::Save, action(&TXVideoEditorViewController::saveAction));
    // Cancel ends the editor exactly as done does, and the trim button saves.
    cancelButton =
        ToolbarItem::systemItem(Kind::Cancel, action(&TXVideoEditorViewController::doneAction));
    cancelTrimButton =
        ToolbarItem::systemItem(Kind::Cancel, action(&TXVideoEditorViewController::undoAction));
    trimButton =
        ToolbarItem::systemItem(Kind::Done, action(&TXVideoEditorViewController::saveAction));
    flexSpace = ToolbarItem::flexibleSpace();
    fixSpace = ToolbarItem::fixedSpace(0.005 * root->frame().width());

    // 10. Top bar; only it takes the host's tint.
    std::shared_ptr<ToolbarDelegate> asToolbarDelegate(self(), static_cast<ToolbarDelegate*>(this));
    topToolBar = new Toolbar(QRectF(0, 0, root->frame().width(), 60));
    topToolBar->setAutoresizingMask(View::FlexibleWidth);
    topToolBar->setDelegate(asToolbarDelegate);
    if (overrideTintColor.isValid())
        topToolBar->setTintColor(overrideTintColor);

    // 11. Bottom bar.
    bottomToolBar = new Toolbar(QRectF(0, root->frame().height() - 44, root->frame().width(), 44));
    bottomToolBar->setAutoresizingMask(View::FlexibleWidth);
    bottomToolBar->setDelegate(asToolbarDelegate);

    // 12. View tree, bottom to top.
    auto* black = new View(root->frame());
    black->setBackgroundColor(Qt::black);
    root->addSubview(black);
    root->addSubview(avPlayerLayer.get());
    root->addSubview(videoOverlay.get());
    root->addSubview(bottomToolBar.get());
    root->addSubview(topToolBar.get());
    root->addSubview(scrubberContainterView.get());
    scrubberContainterView->addSubview(avTrimmer.get());
    root->addSubview(videoOverlayPlayButton->view());

    // 13. Layout for the device.
    chooseLayout();
}

TXVideoEditorViewController::~TXVideoEditorViewController() {
    if (avPlayer)
        avPlayer->removeTimeObserver(playbackTimeObserver);
    removeStatusObserver();
    NotificationCenter::defaultCenter().removeObserver(this);
    FileManager::defaultManager()->_srRemoveFile_completion(trimFilePath, nullptr);
}

void TXVideoEditorViewController::addPeriodicPlayheadObserver() {
    playbackTimeObserver = avPlayer->addPeriodicTimeObserverForInterval_queue_usingBlock(
        kPlayheadInterval, nullptr, [weak = weakSelf()](MediaTime) {
            auto editor = weak.lock();
            if (!editor || editor->isScrubbing())
                return;
            const auto& item = editor->avPlayer->currentItem();
            editor->avTrimmer->setValue(item ? item->currentTime().seconds()
                                             : MediaTime::invalid().seconds());
        });
}

void TXVideoEditorViewController::addStatusObserver() {
    statusObserved_ = avPlayer->currentItem();
    if (auto item = statusObserved_.lock())
        item->addObserver_forKeyPath_options_context(this, QStringLiteral("status"), 0, nullptr);
}

void TXVideoEditorViewController::removeStatusObserver() {
    if (auto item = statusObserved_.lock())
        item->removeObserver_forKeyPath(this, QStringLiteral("status"));
    statusObserved_.reset();
}

void TXVideoEditorViewController::observeEndOfPlay() {
    NotificationCenter::defaultCenter().addObserver(this, itemDidPlayToEndNotification(),
                                                    avPlayerItem.get(),
                                                    [weak = weakSelf()](const Notification& n) {
                                                        if (auto editor = weak.lock())
                                                            editor->itemDidFinishPlaying(n);
                                                    });
}

// The editor's layouts (compact and wide), size transitions and the chrome's
// visibility.

#include "TXVideoEditorViewController.h"

#include "platform/ui/Animation.h"
#include "platform/ui/Device.h"
#include "platform/ui/LayoutConstraint.h"
#include "platform/ui/TransitionCoordinator.h"
#include "platform/ui/ViewAlpha.h"

using namespace platform;

void TXVideoEditorViewController::chooseLayout() {
    if (Device::userInterfaceIdiom() == Device::InterfaceIdiom::Pad)
        applyPadUILayout();
    else if (currentOrientation() == 1)
        applyPadUILayout(); // a phone on its side gets the wide layout too
    else
        applyPhoneUILayout();
}

int TXVideoEditorViewController::currentOrientation() {
    const QRectF bounds = view()->bounds();
    return bounds.width() > bounds.height() ? 1 : 0;
}

void TXVideoEditorViewController::applyPhoneUILayout() {
    const QMarginsF none(0, 0, 0, -0.0);
    playButton->setImageInsets(none);
    pauseButton->setImageInsets(none);
    shareButton->setImageInsets(none);

    if (isTrimming()) {
        topToolBar->setItems({cancelTrimButton, flexSpace, titleButton, flexSpace, trimButton});
        bottomToolBar->setItems({flexSpace, playButton, flexSpace});
    } else if (isIntroMode()) {
        topToolBar->setItems({cancelButton, flexSpace, titleButton, flexSpace, saveButton});
        bottomToolBar->setItems({shareButton, flexSpace});
    } else {
        topToolBar->setItems({cancelButton, flexSpace, titleButton, flexSpace, saveButton});
        bottomToolBar->setItems({shareButton, flexSpace, playButton, flexSpace});
    }
    view()->addSubview(bottomToolBar.get());
    applyPhoneConstraints();
    setPadMode(false);
}

void TXVideoEditorViewController::applyPadUILayout() {
    // Insets are (left, top, right, bottom): the glyphs move down.
    playButton->setImageInsets(QMarginsF(0, 8, 0, -8));
    pauseButton->setImageInsets(QMarginsF(0, 8, 0, -8));
    shareButton->setImageInsets(QMarginsF(0, 5, 0, -5));

    if (isTrimming())
        topToolBar->setItems({cancelTrimButton, flexSpace, titleButton, flexSpace, playButton,
                              fixSpace, trimButton});
    else if (isIntroMode())
        topToolBar->setItems(
            {cancelButton, flexSpace, titleButton, flexSpace, shareButton, fixSpace, saveButton});
    else
        topToolBar->setItems({cancelButton, flexSpace, titleButton, flexSpace, playButton, fixSpace,
                              shareButton, fixSpace, saveButton});
    bottomToolBar->removeFromSuperview();
    applyPadConstraints();
    setPadMode(true);
}

// Constraints accumulate: each pass adds four more; those naming the bottom
// bar go with it when the wide layout takes it away.
void TXVideoEditorViewController::applyPhoneConstraints() {
    View* root = view();
    QWidget* container = scrubberContainterView.get();
    root->addConstraints({
        LayoutConstraint::make(container, LayoutAttribute::Leading, root, LayoutAttribute::Leading,
                               1.0, 0),
        LayoutConstraint::make(container, LayoutAttribute::Trailing, root,
                               LayoutAttribute::Trailing, 1.0, 0),
        LayoutConstraint::make(container, LayoutAttribute::Bottom, bottomToolBar.get(),
                               LayoutAttribute::Top, 1.0, 0),
        LayoutConstraint::constantSize(container, LayoutAttribute::Height, 38),
    });
}

void TXVideoEditorViewController::applyPadConstraints() {
    View* root = view();
    QWidget* container = scrubberContainterView.get();
    root->addConstraints({
        LayoutConstraint::make(container, LayoutAttribute::Leading, root, LayoutAttribute::Leading,
                               1.0, 0),
        LayoutConstraint::make(container, LayoutAttribute::Trailing, root,
                               LayoutAttribute::Trailing, 1.0, 0),
        LayoutConstraint::make(container, LayoutAttribute::Bottom, root, LayoutAttribute::Bottom,
                               1.0, 0),
        LayoutConstraint::constantSize(container, LayoutAttribute::Height, 38),
    });
}

void TXVideoEditorViewController::viewWillTransitionToSize_withTransitionCoordinator(
    const QSizeF& size, TransitionCoordinator& coordinator) {
    ViewController::viewWillTransitionToSize_withTransitionCoordinator(size, coordinator);
    coordinator.animateAlongsideTransition_completion(
        [weak = weakSelf()](TransitionCoordinator&) {
            auto editor = weak.lock();
            if (!editor)
                return;
            editor->topToolBar->setItems({});
            editor->bottomToolBar->setItems({});
            editor->refreshAVRotation();
            editor->chooseLayout();
        },
        {});
}

void TXVideoEditorViewController::viewDidLayoutSubviews() {
    ViewController::viewDidLayoutSubviews();
    const QRectF bounds = view()->bounds();
    avPlayerLayer->setFrame(QRect(0, 0, int(bounds.width()), int(bounds.height())));
}

void TXVideoEditorViewController::handleSingleTap(TapRecognizer* recognizer) {
    configureReplayUIHidden();
}

void TXVideoEditorViewController::configureReplayUIHidden() {
    if (isUIHidden())
        showUI();
    else
        hideUI();
}

void TXVideoEditorViewController::showUI() {
    Animation::animateWithDuration(0.25, [this] {
        ViewAlpha::setAlpha(topToolBar.get(), 1.0);
        ViewAlpha::setAlpha(bottomToolBar.get(), 1.0);
        ViewAlpha::setAlpha(scrubberContainterView.get(), 1.0);
    });
    setUiHidden(false);
}

void TXVideoEditorViewController::hideUI() {
    Animation::animateWithDuration(0.25, [this] {
        ViewAlpha::setAlpha(topToolBar.get(), 0.0);
        ViewAlpha::setAlpha(bottomToolBar.get(), 0.0);
        ViewAlpha::setAlpha(scrubberContainterView.get(), 0.0);
    });
    setUiHidden(true);
}

void TXVideoEditorViewController::viewWillAppear(bool animated) {
    becomeFirstResponder();
    ViewController::viewWillAppear(animated);
}

void TXVideoEditorViewController::viewDidAppear(bool animated) {
    ViewController::viewDidAppear(animated);
}

void TXVideoEditorViewController::viewWillDisappear(bool animated) {
    resignFirstResponder();
    ViewController::viewWillDisappear(animated);
}

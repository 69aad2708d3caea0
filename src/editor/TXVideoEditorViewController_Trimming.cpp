// The editor's trimming: the scrubber's playhead and handles, edit and
// preview modes, undo and shake.

#include "TXVideoEditorViewController.h"

#include "platform/runtime/MainQueue.h"

using namespace platform;

namespace {
// A time at the timescale of the player's current time.
MediaTime atPlayerTimescale(const Player& player, double seconds) {
    return MediaTime::fromSeconds(seconds, player.currentTime().timescale);
}
} // namespace

void TXVideoEditorViewController::movieScrubber_valueDidChange(MovieScrubber* scrubber,
                                                               double value) {
    avPlayer->seekToTime(atPlayerTimescale(*avPlayer, value));
}

void TXVideoEditorViewController::movieScrubberDidBeginScrubbing_withHandle(
    MovieScrubber* scrubber, MovieScrubberHandle handle) {
    setScrubbing(true);
    pauseAction();
}

void TXVideoEditorViewController::movieScrubberDidEndScrubbing_withHandle(
    MovieScrubber* scrubber, MovieScrubberHandle handle) {
    avPlayer->seekToTime(atPlayerTimescale(*avPlayer, avTrimmer->value()));
    setScrubbing(false);
}

void TXVideoEditorViewController::movieScrubberDidBeginEditing(MovieScrubber* scrubber) {
    editMode();
    setTrimming(true);
}

void TXVideoEditorViewController::movieScrubber_editingStartValueDidChange(MovieScrubber* scrubber,
                                                                           double value) {
    // A direct pause: the toolbar keeps whatever button it shows.
    avPlayer->pause();
    editStartTime = value;
    MainQueue::async([editor = self(), value] {
        editor->avPlayer->seekToTime(atPlayerTimescale(*editor->avPlayer, value));
    });
    setTrimming(true);
}

void TXVideoEditorViewController::movieScrubber_editingEndValueDidChange(MovieScrubber* scrubber,
                                                                         double value) {
    avPlayer->pause();
    editEndTime = value;
    MainQueue::async([editor = self(), value] {
        editor->avPlayer->seekToTime(atPlayerTimescale(*editor->avPlayer, value));
    });
    setTrimming(true);
}

void TXVideoEditorViewController::movieScrubberDidCancelEditing(MovieScrubber* scrubber) {
    avTrimmer->setEditing_animated(false, true);
    previewMode();
    setTrimming(false);
}

void TXVideoEditorViewController::undoAction() {
    if (isExporting())
        return;
    if (auto scrubberDelegate = avTrimmer->delegate().lock())
        scrubberDelegate->movieScrubberDidCancelEditing(avTrimmer.get());
}

void TXVideoEditorViewController::motionEnded_withEvent(MotionEvent::Subtype motion,
                                                        const MotionEvent& event) {
    if (event.subtype == MotionEvent::Subtype::MotionShake && isTrimming() && !isExporting())
        undoAction();
    ViewController::motionEnded_withEvent(motion, event);
}

void TXVideoEditorViewController::editMode() {
    if (isPadMode()) {
        topToolBar->setItems({cancelTrimButton, flexSpace, titleButton, flexSpace, playButton,
                              fixSpace, trimButton});
    } else {
        bottomToolBar->setItems({flexSpace, playButton, flexSpace});
        topToolBar->setItems({cancelTrimButton, flexSpace, titleButton, flexSpace, trimButton});
    }
    setHasEdit(true);
}

void TXVideoEditorViewController::previewMode() {
    const auto& first = hasEdit() ? doneButton : cancelButton;
    if (isPadMode()) {
        topToolBar->setItems({first, flexSpace, titleButton, flexSpace, playButton, fixSpace,
                              shareButton, fixSpace, saveButton});
    } else {
        bottomToolBar->setItems({shareButton, flexSpace, playButton, flexSpace});
        topToolBar->setItems({first, flexSpace, titleButton, flexSpace, saveButton});
    }
}

// The editor's player: loading, the playhead, play and pause, the end of play.

#include "TXVideoEditorViewController.h"

#include "overlay/TXVideoOverlayButton.h"
#include "platform/ui/View.h"

using namespace platform;

void TXVideoEditorViewController::reloadAVLayerWithURL(const QUrl& url) {
    if (isTrimming())
        if (auto scrubberDelegate = avTrimmer->delegate().lock())
            scrubberDelegate->movieScrubberDidCancelEditing(avTrimmer.get());
    videoURL = url;
    removeStatusObserver();
    avAsset = Asset::assetWithURL(url);
    avPlayerItem = PlayerItem::playerItemWithAsset(avAsset);
    avPlayer = Player::playerWithPlayerItem(avPlayerItem);
    avPlayer->setActionAtItemEnd(Player::ActionAtItemEnd::Pause);
    avPlayer->seekToTime(MediaTime::zero());
    avPlayerLayer->setPlayer(avPlayer);
    addStatusObserver();
    setScrubbing(false);
    addPeriodicPlayheadObserver();
}

void TXVideoEditorViewController::observeValueForKeyPath_ofObject_change_context(
    const QString& keyPath, const void* object, const QVariantMap& change, void* context) {
    const auto& item = avPlayer->currentItem();
    if (!item || object != item.get() || keyPath != QLatin1String("status"))
        return;
    if (item->status() != PlayerItem::Status::ReadyToPlay)
        return;
    thumbnailGenerator.reset();
    cachedTimeStamps.reset();
    avTrimmer->setDelegate(std::shared_ptr<MovieScrubberDelegate>(self(), this));
    avTrimmer->setDataSource(std::shared_ptr<MovieScrubberDataSource>(self(), this));
    editStartTime = 0.0;
    editEndTime = getPlayerDuration();
    avTrimmer->reloadData();
}

void TXVideoEditorViewController::itemDidFinishPlaying(const Notification& notification) {
    pauseAction();
    if (isUIHidden())
        showUI();
    avPlayer->seekToTime(MediaTime::zero());
}

void TXVideoEditorViewController::playAction() {
    if (isTrimming()) {
        const std::int32_t timescale = avPlayer->currentTime().timescale;
        avPlayer->seekToTime(MediaTime::fromSeconds(editStartTime, timescale));
        const MediaTime end =
            MediaTime::fromSeconds(editEndTime, avPlayer->currentTime().timescale);
        timeObserver = avPlayer->addBoundaryTimeObserverForTimes_queue_usingBlock(
            {end}, nullptr, [weak = weakSelf()] {
                if (auto editor = weak.lock())
                    editor->pauseAction();
            });
        avPlayer->play();
    } else {
        avPlayer->play();
    }
    if (!isUIHidden())
        hideUI();
    if (isIntroMode()) {
        View::removeFromSuperview(videoOverlayPlayButton->view());
        setIntroMode(false);
    }
    if (isPadMode()) {
        if (isTrimming())
            topToolBar->setItems({cancelTrimButton, flexSpace, titleButton, flexSpace, pauseButton,
                                  fixSpace, shareButton, fixSpace, trimButton});
        else
            topToolBar->setItems({cancelButton, flexSpace, titleButton, flexSpace, pauseButton,
                                  fixSpace, shareButton, fixSpace, saveButton});
    } else {
        bottomToolBar->setItems({shareButton, flexSpace, pauseButton, flexSpace});
    }
}

void TXVideoEditorViewController::pauseAction() {
    avPlayer->pause();
    if (isPadMode()) {
        if (isTrimming())
            topToolBar->setItems({cancelTrimButton, flexSpace, titleButton, flexSpace, playButton,
                                  fixSpace, shareButton, fixSpace, trimButton});
        else
            topToolBar->setItems({cancelButton, flexSpace, titleButton, flexSpace, playButton,
                                  fixSpace, shareButton, fixSpace, saveButton});
    } else {
        bottomToolBar->setItems({shareButton, flexSpace, playButton, flexSpace});
    }
}

void TXVideoEditorViewController::refreshAVRotation() {
    const QRectF bounds = view()->bounds();
    avPlayerLayer->setFrame(bounds.toRect());
    topToolBar->setFrame(QRectF(0, 0, bounds.width(), 60.0));
    bottomToolBar->setFrame(QRectF(0, bounds.height() - 44.0, bounds.width(), 44.0));
    thumbnailGenerator.reset();
    cachedTimeStamps.reset();
    avTrimmer->reloadData();
}

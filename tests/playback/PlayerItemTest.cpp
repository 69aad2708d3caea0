#include "PlaybackFixture.h"
#include "platform/media/playback/Player.h"
#include "platform/runtime/MainQueue.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QBuffer>
#include <QCoreApplication>
#include <QFile>
#include <QImage>

#include <gtest/gtest.h>

using namespace platform;
using playback_test::clipUrl;
using playback_test::waitForStatus;
using testing_support::waitUntil;

namespace {

class RecordingObserver : public KeyValueObserver {
  public:
    void observeValueForKeyPath_ofObject_change_context(const QString& keyPath, const void* object,
                                                        const QVariantMap& change,
                                                        void* context) override {
        calls.append({keyPath, object, change, context, MainQueue::isCurrent()});
    }
    struct Call {
        QString keyPath;
        const void* object;
        QVariantMap change;
        void* context;
        bool onMainThread;
    };
    QList<Call> calls;
};

} // namespace

TEST(PlaybackPlayerItem, MovieBecomesReadyAndObserversHearItOnTheMainThread) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
    EXPECT_EQ(item->status(), PlayerItem::Status::Unknown);
    EXPECT_FALSE(item->duration().isValid());
    EXPECT_FALSE(item->currentTime().isValid()) << "in no player yet";

    RecordingObserver observer;
    int context = 0;
    item->addObserver_forKeyPath_options_context(&observer, "status", KeyValueObserver::New,
                                                 &context);
    QList<PlayerItem::Status> seen;
    bool callbackOnMain = false;
    item->addStatusObserver([&](PlayerItem& changed) {
        seen.append(changed.status());
        callbackOnMain = MainQueue::isCurrent();
    });

    auto player = Player::playerWithPlayerItem(item);
    ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
    ASSERT_TRUE(waitUntil([&] { return !seen.isEmpty() && !observer.calls.isEmpty(); }));
    EXPECT_EQ(seen, QList{PlayerItem::Status::ReadyToPlay});
    EXPECT_TRUE(callbackOnMain);
    ASSERT_EQ(observer.calls.size(), 1);
    EXPECT_EQ(observer.calls[0].keyPath, "status");
    EXPECT_EQ(observer.calls[0].object, item.get());
    EXPECT_EQ(observer.calls[0].context, &context);
    EXPECT_EQ(observer.calls[0].change.value("new").toInt(), 1);
    EXPECT_TRUE(observer.calls[0].onMainThread);
    EXPECT_EQ(item->error(), nullptr);

    // Times are at the video track's timescale.
    const auto video = item->asset()->tracksWithMediaType(MediaType::Video);
    ASSERT_FALSE(video.isEmpty());
    EXPECT_EQ(item->timescale(), video.first().naturalTimeScale);
    EXPECT_EQ(player->currentTime().timescale, video.first().naturalTimeScale);
    EXPECT_EQ(item->currentTime(), MediaTime::zero());
    EXPECT_EQ(item->duration(), item->asset()->duration());
    const auto loaded = item->loadedTimeRanges();
    ASSERT_FALSE(loaded.isEmpty());
    EXPECT_EQ(loaded.first().start, MediaTime::zero());
    EXPECT_GT(loaded.last().end(), MediaTime::fromSeconds(0.5, 600));

    item->removeObserver_forKeyPath(&observer, "status");
}

TEST(PlaybackPlayerItem, WhatIsNotAMovieFailsWithAnError) {
    QImage still(64, 48, QImage::Format_RGB32);
    still.fill(Qt::red);
    const QUrl png = playback_test::fileWithBytes("still.png", [&] {
        QByteArray bytes;
        QBuffer buffer(&bytes);
        buffer.open(QIODevice::WriteOnly);
        still.save(&buffer, "PNG");
        return bytes;
    }());
    const QList<QUrl> urls = {
        playback_test::fileWithBytes("notes.txt", "these are\nnot frames\n"),
        playback_test::fileWithBytes(
            "list.m3u",
            "#EXTM3U\n" + clipUrl("one", playback_test::oneSecond()).toLocalFile().toUtf8() + "\n"),
        playback_test::fileWithBytes("empty.mp4", QByteArray()),
        png,
        QUrl::fromLocalFile("/nonexistent/nowhere.mp4"),
        QUrl("https://example.invalid/movie.mp4"),
    };
    testing_support::LogCapture log;
    for (const QUrl& url : urls) {
        SCOPED_TRACE(url.toString().toStdString());
        auto item = PlayerItem::playerItemWithURL(url);
        auto player = Player::playerWithPlayerItem(item);
        EXPECT_EQ(waitForStatus(item), PlayerItem::Status::Failed);
        ASSERT_NE(item->error(), nullptr);
        EXPECT_NE(item->error()->code(), 0);
        EXPECT_FALSE(item->duration().isValid());
        EXPECT_TRUE(item->loadedTimeRanges().isEmpty());
        // The player stays usable: nothing here may crash or hang.
        player->play();
        player->seekToTime(MediaTime::fromSeconds(0.5, 600));
        player->pause();
        // A failed status never turns into another one.
        QCoreApplication::processEvents();
        EXPECT_EQ(item->status(), PlayerItem::Status::Failed);
    }
    EXPECT_FALSE(log.startingWith("player: item failed").isEmpty());
}

TEST(PlaybackPlayerItem, TruncatedRecordingFailsOrPlaysWhatItCan) {
    testmedia::MovieSpec movieSpec = playback_test::oneSecond();
    movieSpec.truncated = true;
    auto item = PlayerItem::playerItemWithURL(clipUrl("truncated", movieSpec));
    playback_test::EndWatcher end(item);
    auto player = Player::playerWithPlayerItem(item);
    const auto status = waitForStatus(item);
    ASSERT_NE(status, PlayerItem::Status::Unknown);
    if (status == PlayerItem::Status::Failed) {
        EXPECT_NE(item->error(), nullptr);
        return;
    }
    player->play();
    EXPECT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));
}

TEST(PlaybackPlayerItem, ObserverRemovedBeforeItsDeliveryIsNotCalled) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
    int firstCalls = 0, removedCalls = 0;
    RecordingObserver removedObject;
    int removedToken = 0;
    // Each registration's delivery is queued on its own; the first one
    // removes the others before theirs run.
    item->addStatusObserver([&](PlayerItem& changed) {
        ++firstCalls;
        changed.removeStatusObserver(removedToken);
        changed.removeObserver_forKeyPath(&removedObject, "status");
    });
    removedToken = item->addStatusObserver([&](PlayerItem&) { ++removedCalls; });
    item->addObserver_forKeyPath_options_context(&removedObject, "status", 0, nullptr);
    auto player = Player::playerWithPlayerItem(item);
    ASSERT_TRUE(waitUntil([&] { return firstCalls == 1; }));
    QCoreApplication::processEvents();
    EXPECT_EQ(removedCalls, 0);
    EXPECT_TRUE(removedObject.calls.isEmpty());
}

TEST(PlaybackPlayerItem, DevicePathsPlayFromTheirHostDirectory) {
    testing_support::MobileRoot root;
    root.makeLibrary();
    const QString hostPath = root.hostPath("Library/Tamsel/Racer_1.mp4");
    ASSERT_TRUE(QFile::copy(playback_test::clipPath("one", playback_test::oneSecond()), hostPath));
    auto item = PlayerItem::playerItemWithURL(
        QUrl::fromLocalFile("/private/var/mobile/Library/Tamsel/Racer_1.mp4"));
    auto player = Player::playerWithPlayerItem(item);
    EXPECT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
}

TEST(PlaybackPlayerItem, AnItemPlaysInOnePlayerAtATime) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
    auto first = Player::playerWithPlayerItem(item);
    testing_support::LogCapture log;
    auto second = Player::playerWithPlayerItem(item);
    EXPECT_EQ(first->currentItem(), item);
    EXPECT_EQ(second->currentItem(), nullptr);
    EXPECT_EQ(log.startingWith("player: an item cannot be in two players").size(), 1);
    EXPECT_FALSE(second->currentTime().isValid());
    // Once the first player lets it go, another may take it.
    first->replaceCurrentItemWithPlayerItem(nullptr);
    EXPECT_FALSE(item->currentTime().isValid());
    second->replaceCurrentItemWithPlayerItem(item);
    EXPECT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
}

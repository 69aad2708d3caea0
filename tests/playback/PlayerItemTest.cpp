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
using namespace playback_test;
using testing_support::waitUntil;

namespace {
struct RecordingObserver : KeyValueObserver {
    void observeValueForKeyPath_ofObject_change_context(const QString& keyPath, const void* object,
                                                        const QVariantMap& change,
                                                        void* context) override {
        EXPECT_TRUE(MainQueue::isCurrent());
        calls.append({keyPath, object, change.value("new").toInt(), context});
    }
    struct Call {
        QString keyPath;
        const void* object;
        int value;
        void* context;
        bool operator==(const Call&) const = default;
    };
    QList<Call> calls;
};
} // namespace

TEST(PlaybackPlayerItem, AMovieAtADevicePathBecomesReadyAndObserversHearItOnTheMainThread) {
    testing_support::MobileRoot root;
    root.makeLibrary();
    ASSERT_TRUE(QFile::copy(clip(1).toLocalFile(), root.hostPath("Library/Tamsel/Racer_1.mp4")));
    auto item = PlayerItem::playerItemWithURL(
        QUrl::fromLocalFile("/private/var/mobile/Library/Tamsel/Racer_1.mp4"));
    EXPECT_EQ(item->status(), PlayerItem::Status::Unknown);
    EXPECT_FALSE(item->duration().isValid());
    EXPECT_FALSE(item->currentTime().isValid()) << "in no player yet";

    RecordingObserver observer, removed;
    int context = 0, removedCalls = 0, removedToken = 0;
    item->addObserver_forKeyPath_options_context(&observer, "status", KeyValueObserver::New,
                                                 &context);
    QList<PlayerItem::Status> seen;
    // Each registration's delivery is queued on its own; the first one
    // removes the later ones before theirs run.
    item->addStatusObserver([&](PlayerItem& changed) {
        EXPECT_TRUE(MainQueue::isCurrent());
        seen.append(changed.status());
        changed.removeStatusObserver(removedToken);
        changed.removeObserver_forKeyPath(&removed, "status");
    });
    removedToken = item->addStatusObserver([&](PlayerItem&) { ++removedCalls; });
    item->addObserver_forKeyPath_options_context(&removed, "status", 0, nullptr);

    auto player = readyPlayer(item);
    ASSERT_TRUE(waitUntil([&] { return !seen.isEmpty() && !observer.calls.isEmpty(); }));
    QCoreApplication::processEvents();
    EXPECT_EQ(seen, QList{PlayerItem::Status::ReadyToPlay});
    EXPECT_EQ(observer.calls,
              (QList<RecordingObserver::Call>{{"status", item.get(), 1, &context}}));
    EXPECT_EQ(removedCalls, 0);
    EXPECT_TRUE(removed.calls.isEmpty());
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
    QByteArray png;
    QBuffer buffer(&png);
    buffer.open(QIODevice::WriteOnly);
    QImage(64, 48, QImage::Format_RGB32).save(&buffer, "PNG");
    // What the asset refuses is MediaOpening's; these FFmpeg would open.
    const QList<QUrl> urls = {
        fileWithBytes("list.m3u", "#EXTM3U\n" + clip(1).toLocalFile().toUtf8() + "\n"),
        fileWithBytes("still.png", png),
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
        // The player stays usable, and a failed status never turns into
        // another one.
        player->play();
        player->seekToTime(MediaTime::fromSeconds(0.5, 600));
        player->pause();
        QCoreApplication::processEvents();
        EXPECT_EQ(item->status(), PlayerItem::Status::Failed);
    }
    EXPECT_FALSE(log.startingWith("player: item failed").isEmpty());
}

#include "PlaybackFixture.h"

#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/MainQueue.h"
#include "support/Wait.h"

#include <QFile>
#include <QHash>
#include <QTemporaryDir>

#include <gtest/gtest.h>

namespace playback_test {

namespace {
QString pathOf(const QString& name) {
    static QTemporaryDir dir;
    return dir.filePath(name);
}
} // namespace

QUrl clipUrl(const QString& name, const testmedia::MovieSpec& movieSpec) {
    static QHash<QString, QString> made;
    if (!made.contains(name)) {
        const QString path = pathOf(name + testmedia::suffixFor(movieSpec));
        QString error;
        if (!testmedia::writeMovie(path, movieSpec, &error))
            ADD_FAILURE() << "cannot make clip " << name.toStdString() << ": "
                          << error.toStdString();
        made.insert(name, path);
    }
    return QUrl::fromLocalFile(made.value(name));
}

testmedia::MovieSpec plain(double seconds) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = seconds;
    return movieSpec;
}

QUrl clip(double seconds) {
    return clipUrl(QStringLiteral("plain-%1s").arg(seconds), plain(seconds));
}

QUrl fileWithBytes(const QString& name, const QByteArray& bytes) {
    QFile file(pathOf(name));
    if (!file.open(QIODevice::WriteOnly) || file.write(bytes) != bytes.size())
        ADD_FAILURE() << "cannot write " << name.toStdString();
    return QUrl::fromLocalFile(file.fileName());
}

platform::PlayerItem::Status waitForStatus(const std::shared_ptr<platform::PlayerItem>& item) {
    testing_support::waitUntil(
        [&] { return item->status() != platform::PlayerItem::Status::Unknown; });
    return item->status();
}

std::shared_ptr<platform::Player> readyPlayer(const std::shared_ptr<platform::PlayerItem>& item) {
    auto player = platform::Player::playerWithPlayerItem(item);
    EXPECT_EQ(waitForStatus(item), platform::PlayerItem::Status::ReadyToPlay);
    return player;
}

EndWatcher::EndWatcher(const std::shared_ptr<platform::PlayerItem>& item) {
    platform::NotificationCenter::defaultCenter().addObserver(
        this, platform::itemDidPlayToEndNotification(), item.get(),
        [this](const platform::Notification&) {
            ++count_;
            EXPECT_TRUE(platform::MainQueue::isCurrent());
        });
}

EndWatcher::~EndWatcher() {
    platform::NotificationCenter::defaultCenter().removeObserver(this);
}

bool EndWatcher::waitFor(int n) const {
    return testing_support::waitUntil([&] { return count_ >= n; }, 15000);
}

} // namespace playback_test

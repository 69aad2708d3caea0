#include "PlaybackFixture.h"

#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/MainQueue.h"
#include "support/Wait.h"

#include <QDir>
#include <QFile>
#include <QHash>
#include <QTemporaryDir>

#include <gtest/gtest.h>

namespace playback_test {

namespace {

QTemporaryDir& directory() {
    static QTemporaryDir dir;
    return dir;
}

} // namespace

QString clipPath(const QString& name, const testmedia::MovieSpec& movieSpec) {
    static QHash<QString, QString> made;
    if (made.contains(name))
        return made.value(name);
    const QString path = directory().filePath(name + QStringLiteral(".mp4"));
    QString error;
    if (!testmedia::writeMovie(path, movieSpec, &error))
        ADD_FAILURE() << "cannot make clip " << name.toStdString() << ": " << error.toStdString();
    made.insert(name, path);
    return path;
}

QUrl clipUrl(const QString& name, const testmedia::MovieSpec& movieSpec) {
    return QUrl::fromLocalFile(clipPath(name, movieSpec));
}

QUrl fileWithBytes(const QString& name, const QByteArray& bytes) {
    const QString path = directory().filePath(name);
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write(bytes) != bytes.size())
        ADD_FAILURE() << "cannot write " << path.toStdString();
    return QUrl::fromLocalFile(path);
}

testmedia::MovieSpec oneSecond() {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 1;
    return movieSpec;
}

testmedia::MovieSpec twoSeconds() {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 2;
    movieSpec.keyframeInterval = 30;
    return movieSpec;
}

platform::PlayerItem::Status waitForStatus(const std::shared_ptr<platform::PlayerItem>& item,
                                           int timeoutMs) {
    testing_support::waitUntil(
        [&] { return item->status() != platform::PlayerItem::Status::Unknown; }, timeoutMs);
    return item->status();
}

EndWatcher::EndWatcher(const std::shared_ptr<platform::PlayerItem>& item) {
    platform::NotificationCenter::defaultCenter().addObserver(
        this, platform::itemDidPlayToEndNotification(), item.get(),
        [this](const platform::Notification&) {
            ++count_;
            onMainThread_ = onMainThread_ && platform::MainQueue::isCurrent();
        });
}

EndWatcher::~EndWatcher() {
    platform::NotificationCenter::defaultCenter().removeObserver(this);
}

} // namespace playback_test

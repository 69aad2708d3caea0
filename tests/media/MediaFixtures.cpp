#include "MediaFixtures.h"

#include <QHash>
#include <QTemporaryDir>
#include <QTextStream>
#include <gtest/gtest.h>

#include <mutex>

namespace mediatest {
namespace {

QTemporaryDir& runDirectory() {
    static QTemporaryDir dir;
    return dir;
}

QString keyOf(const testmedia::MovieSpec& s) {
    QString key;
    QTextStream(&key) << s.width << 'x' << s.height << '_' << s.fps << '_' << s.seconds << '_'
                      << s.audio << s.rotationDegrees << '_' << s.keyframeInterval << '_'
                      << s.variableFrameRate << s.truncated << s.fastStart << s.bFrames << '_'
                      << s.crf << s.scene << '_' << s.audioSampleRate << '_' << s.audioStart << '_'
                      << int(s.container) << int(s.videoCodec) << int(s.audioCodec) << s.audioTracks
                      << s.segmentIndex << '_' << s.startSeconds << '_' << s.x264Preset;
    return key;
}

} // namespace

QString movieFor(const testmedia::MovieSpec& movieSpec) {
    static std::mutex mutex;
    static QHash<QString, QString> made;
    std::lock_guard lock(mutex);
    const QString key = keyOf(movieSpec);
    if (made.contains(key))
        return made.value(key);
    const QString path = runDirectory().filePath(key + testmedia::suffixFor(movieSpec));
    QString error;
    const bool written = testmedia::writeMovie(path, movieSpec, &error);
    EXPECT_TRUE(written) << error.toStdString();
    made.insert(key, path);
    return path;
}

QString scratchPath(const QString& name) {
    static int counter = 0;
    return runDirectory().filePath(QStringLiteral("%1-%2").arg(++counter).arg(name));
}

} // namespace mediatest

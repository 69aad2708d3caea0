#include "MediaFixtures.h"

#include <QHash>
#include <QTemporaryDir>
#include <gtest/gtest.h>

#include <mutex>

namespace mediatest {
namespace {

QTemporaryDir& runDirectory() {
    static QTemporaryDir dir;
    return dir;
}

QString keyOf(const testmedia::MovieSpec& s) {
    const QList<double> fields = {double(s.width),
                                  double(s.height),
                                  s.fps,
                                  s.seconds,
                                  double(s.audio),
                                  double(s.rotationDegrees),
                                  double(s.keyframeInterval),
                                  double(s.variableFrameRate),
                                  double(s.truncated),
                                  double(s.fastStart),
                                  double(s.bFrames),
                                  double(s.crf),
                                  double(s.scene),
                                  double(s.audioSampleRate),
                                  s.audioStart,
                                  double(s.container),
                                  double(s.videoCodec),
                                  double(s.audioCodec),
                                  double(s.audioTracks),
                                  double(s.segmentIndex),
                                  s.startSeconds};
    QStringList parts;
    for (double f : fields)
        parts.append(QString::number(f));
    return parts.join(QLatin1Char('_')) + QLatin1Char('_') + s.x264Preset;
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

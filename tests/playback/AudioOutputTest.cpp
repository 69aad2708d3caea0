#include "platform/media/playback/AudioOutput.h"
#include "support/TempDir.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

#include <gtest/gtest.h>

namespace AudioOutput = platform::AudioOutput;

TEST(PlaybackAudioOutput, UsesTheSoundServerWhenThereIsOneAndSilenceOtherwise) {
    QTemporaryDir runtime;
    testing_support::ScopedEnv env("XDG_RUNTIME_DIR", runtime.path().toUtf8());
    for (const char* name : {"PULSE_SERVER", "PIPEWIRE_REMOTE", "TAMSEL_AUDIO"})
        env.unset(name);
    const auto touch = [&](const QString& name) {
        QDir(runtime.path()).mkpath(QFileInfo(name).path());
        QFile(runtime.filePath(name)).open(QIODevice::WriteOnly);
    };
    // No server socket: silence, without probing sound devices.
    EXPECT_EQ(AudioOutput::mpvOption(), "null");

    // A PulseAudio socket (PipeWire's compatibility one included), unless
    // silence is asked for.
    touch("pulse/native");
    EXPECT_EQ(AudioOutput::mpvOption(), "pipewire,pulse,null");
    env.set("TAMSEL_AUDIO", "null");
    EXPECT_EQ(AudioOutput::mpvOption(), "null");
    env.unset("TAMSEL_AUDIO");
    QFile::remove(runtime.filePath("pulse/native"));

    // A PipeWire socket by its configured name, or an explicit server.
    env.set("PIPEWIRE_REMOTE", "custom-0");
    EXPECT_EQ(AudioOutput::mpvOption(), "null");
    touch("custom-0");
    EXPECT_EQ(AudioOutput::mpvOption(), "pipewire,pulse,null");
    env.unset("PIPEWIRE_REMOTE");
    env.set("PULSE_SERVER", "tcp:localhost:4713");
    EXPECT_EQ(AudioOutput::mpvOption(), "pipewire,pulse,null");
}

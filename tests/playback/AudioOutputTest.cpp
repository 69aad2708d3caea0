#include "platform/media/playback/AudioOutput.h"
#include "support/TempDir.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using testing_support::ScopedEnv;

TEST(PlaybackAudioOutput, UsesTheSoundServerWhenThereIsOneAndSilenceOtherwise) {
    QTemporaryDir runtime;
    ScopedEnv env;
    env.set("XDG_RUNTIME_DIR", runtime.path().toUtf8());
    env.unset("PULSE_SERVER");
    env.unset("PIPEWIRE_REMOTE");
    env.unset("TAMSEL_AUDIO");

    // No server socket: silence, without probing sound devices.
    EXPECT_EQ(platform::AudioOutput::mpvOption(), "null");

    // A PulseAudio socket (PipeWire's compatibility one included).
    QDir(runtime.path()).mkpath("pulse");
    QFile socket(runtime.filePath("pulse/native"));
    ASSERT_TRUE(socket.open(QIODevice::WriteOnly));
    socket.close();
    EXPECT_EQ(platform::AudioOutput::mpvOption(), "pipewire,pulse,null");

    // Asked for silence, the server is left alone.
    env.set("TAMSEL_AUDIO", "null");
    EXPECT_EQ(platform::AudioOutput::mpvOption(), "null");
    env.unset("TAMSEL_AUDIO");

    // A PipeWire socket by its configured name, or an explicit server.
    QFile::remove(runtime.filePath("pulse/native"));
    EXPECT_EQ(platform::AudioOutput::mpvOption(), "null");
    env.set("PIPEWIRE_REMOTE", "custom-0");
    QFile pipewire(runtime.filePath("custom-0"));
    ASSERT_TRUE(pipewire.open(QIODevice::WriteOnly));
    pipewire.close();
    EXPECT_EQ(platform::AudioOutput::mpvOption(), "pipewire,pulse,null");
    env.unset("PIPEWIRE_REMOTE");
    env.set("PULSE_SERVER", "tcp:localhost:4713");
    EXPECT_EQ(platform::AudioOutput::mpvOption(), "pipewire,pulse,null");
}

#pragma once

#include <QImage>
#include <QString>
#include <functional>

// Writes synthetic recordings (H.264 + AAC in MP4) for the tests, the
// benchmarks and the sample that the build ships. Every frame carries its own
// index as a block code in its top quarter, so whoever decodes a frame can tell
// which one it is; the audio carries a short tone burst at every whole second
// of media time, so whoever decodes both can check that they are in sync.
namespace testmedia {

struct MovieSpec {
    int width = 320;
    int height = 240;
    double fps = 30;
    double seconds = 2;
    bool audio = true;
    // Clockwise turn that a player applies when showing the frames, written as
    // the track's display matrix (0, 90, 180 or 270); the frames themselves
    // stay in the coded size.
    int rotationDegrees = 0;
    int keyframeInterval = 30;
    // Frame times drift around the nominal grid (see frameTime), as in
    // recordings whose capture rate follows the screen's refresh.
    bool variableFrameRate = false;
    // The file is cut short after writing, as when a recorder dies mid-way:
    // the sample tables (written last) are missing.
    bool truncated = false;

    // Optional beyond the common fields.
    bool fastStart = false; // sample tables before the samples
    int bFrames = 0;        // B-frames between references (reordered pts)
    QString x264Preset = QStringLiteral("ultrafast");
    int crf = 23;
    bool scene = false; // a calm desktop-like scene instead of the test pattern
    int audioSampleRate = 48000;
    double audioStart = 0; // the audio track begins this many seconds in
};

// Writes the movie to `hostPath` (replacing a file there). Returns false and
// sets `error` when it cannot. `progress`, when given, receives the fraction
// done from time to time. Callable from any thread; no shared state.
bool writeMovie(const QString& hostPath, const MovieSpec& movieSpec, QString* error = nullptr);
bool writeMovie(const QString& hostPath, const MovieSpec& movieSpec, QString* error,
                const std::function<void(double)>& progress);

// The number of frames writeMovie writes for `movieSpec`.
int frameCount(const MovieSpec& movieSpec);

// The presentation time, in seconds, of frame `index` in a movie made from
// `movieSpec` (uneven when variableFrameRate is set).
double frameTime(const MovieSpec& movieSpec, int index);

// Bits of the frame code: enough for ten minutes at 60 frames a second and
// more. The code band is the top quarter, 8 cells across and 2 down.
constexpr int kFrameCodeBits = 16;

// Reads the index written into a decoded frame, in its coded orientation
// (before the display matrix is applied), at any scale down to about 32
// pixels wide. Returns -1 when the code cannot be read with confidence.
int readFrameIndex(const QImage& frame);

// Same, on an 8-bit luma plane (the Y plane of a decoded YUV frame).
int readFrameIndex(const unsigned char* luma, int width, int height, int stride);

// The sync mark of the test pattern's audio: a burst of this length and
// frequency starts at every whole second of media time, from 0 on. (The scene
// has a soft chime instead, and its frames carry no code.)
constexpr double kBurstSeconds = 0.05;
constexpr double kBurstFrequency = 1000.0;

} // namespace testmedia

#pragma once

#include <QImage>
#include <QString>
#include <functional>

// Writes synthetic recordings for the tests, the benchmarks and the sample that
// the build ships: by default H.264 + AAC in MP4, and every container and codec
// that Linux screen recorders write. Every frame carries its own
// index as a block code in its top quarter, so whoever decodes a frame can tell
// which one it is; the audio carries a short tone burst at every whole second
// of media time, so whoever decodes both can check that they are in sync.
namespace testmedia {

enum class Container {
    Mp4,
    FragmentedMp4, // an empty movie box, then a fragment per keyframe
    Matroska,
    WebM,
};
enum class VideoCodec { H264, H264_444, HEVC, VP8, VP9 };
enum class AudioCodec { AAC, Vorbis, Opus };

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
    // The file is cut short after writing (at 55% of its bytes), as when a
    // recorder dies mid-way: an MP4 lacks its sample tables (written last), a
    // fragmented MP4 ends inside a fragment, a Matroska file (written as a
    // live recorder writes it, without duration or cues) inside a cluster.
    bool truncated = false;

    // Optional beyond the common fields.
    bool fastStart = false; // sample tables before the samples
    int bFrames = 0;        // B-frames between references (reordered pts)
    QString x264Preset = QStringLiteral("ultrafast");
    int crf = 23;
    bool scene = false; // a calm desktop-like scene instead of the test pattern
    int audioSampleRate = 48000;
    double audioStart = 0; // the audio track begins this many seconds in

    Container container = Container::Mp4;
    VideoCodec videoCodec = VideoCodec::H264;
    AudioCodec audioCodec = AudioCodec::AAC;
    // Audio tracks when `audio` is set. The second is a "microphone": its
    // burst (see kSecondTrackBurstOffset) comes half a second after each of
    // the first track's.
    int audioTracks = 1;
    // Fragmented MP4: a segment index (sidx) before the fragments.
    bool segmentIndex = false;
    // Every timestamp starts this late, as in a capture remuxed from a stream.
    double startSeconds = 0;
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
constexpr double kSecondTrackBurstOffset = 0.5;

// The file name suffix that suits the container (".mp4", ".mkv", ".webm").
QString suffixFor(const MovieSpec& movieSpec);

} // namespace testmedia

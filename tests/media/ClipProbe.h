#pragma once

#include <QString>
#include <QTransform>

#include <vector>

// Reads back what a player would show of a movie, with FFmpeg directly (not
// through the code under test): the frames in presentation order with their
// times and codes, the audio's burst onsets, the tracks' lengths and the
// display matrix.
namespace mediatest {

struct ShownFrame {
    double seconds; // presentation time, edit list applied
    int index;      // the generator's frame code, -1 when unreadable
};

struct ClipInfo {
    bool opened = false;
    int videoTracks = 0;
    int audioTracks = 0;
    int width = 0, height = 0;
    QTransform transform;     // from the display matrix
    double videoDuration = 0; // seconds, from the container
    double audioDuration = 0;
    std::vector<ShownFrame> frames;  // decoded, up to maxFrames
    std::vector<double> burstOnsets; // seconds, where the audio rises above half scale
    double audioPeak = 0;            // largest absolute sample
};

// Decodes up to `maxFrames` video frames (all when -1) and the whole audio.
ClipInfo probeClip(const QString& path, int maxFrames = -1);

} // namespace mediatest

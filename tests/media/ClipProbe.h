#pragma once

#include <QByteArray>
#include <QList>
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
    QString format;     // the demuxer's name ("mov,mp4,m4a,3gp,3g2,mj2" for MP4)
    QString videoCodec; // FFmpeg's codec names
    QString audioCodec;
    double startTime = 0; // seconds, of the earliest stream (what players count from)
    int audioTracks = 0;
    QTransform transform;     // from the display matrix
    double videoDuration = 0; // seconds, from the container
    double audioDuration = 0;
    double audioStart = 1e9;         // seconds, where the first decoded audio sample starts
    double audioEnd = 0;             // seconds, where the last decoded audio sample ends
    std::vector<ShownFrame> frames;  // decoded, up to maxFrames
    std::vector<double> burstOnsets; // seconds, where the audio rises above half scale
    double audioPeak = 0;            // largest absolute sample
    // Lines FFmpeg logged at error level or worse while reading and decoding.
    int errorLines = 0;
    // Every track's decode times rise from packet to packet.
    bool decodeTimesRise = true;
    // The video's keyframe payloads in file order, to tell a copied stream
    // from an encoded one.
    QList<QByteArray> keyframes;
};

// Decodes up to `maxFrames` video frames (all when -1) and the whole audio.
// Not to be called while another thread uses FFmpeg's log.
ClipInfo probeClip(const QString& path, int maxFrames = -1);

} // namespace mediatest

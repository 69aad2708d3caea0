// tamsel-make-media: writes a synthetic recording for tests, benchmarks and
// the sample that the build ships.
#include "MediaGenerator.h"

#include <QCommandLineParser>
#include <QCoreApplication>

#include <cstdio>

extern "C" {
#include <libavutil/log.h>
}

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription(
        "Writes a recording whose frames carry their index (H.264 + AAC in MP4 unless told).");
    parser.addHelpOption();
    parser.addPositionalArgument("output", "The file to write.");
    const QCommandLineOption size({"s", "size"}, "Coded size, WxH.", "WxH", "320x240");
    const QCommandLineOption fps("fps", "Frames per second.", "rate", "30");
    const QCommandLineOption seconds("seconds", "Length in seconds.", "seconds", "2");
    const QCommandLineOption noAudio("no-audio", "Leave out the audio track.");
    const QCommandLineOption rotation("rotation", "Clockwise display turn.", "degrees", "0");
    const QCommandLineOption keyint("keyint", "Frames between keyframes.", "frames", "30");
    const QCommandLineOption vfr("vfr", "Uneven frame times.");
    const QCommandLineOption truncated("truncated", "Cut the file short.");
    const QCommandLineOption fastStart("faststart", "Sample tables before the samples.");
    const QCommandLineOption bframes("bframes", "B-frames between references.", "count", "0");
    const QCommandLineOption preset("preset", "x264 preset.", "name", "ultrafast");
    const QCommandLineOption crf("crf", "x264 constant rate factor.", "crf", "23");
    const QCommandLineOption scene("scene", "A desktop-like scene instead of the test pattern.");
    const QCommandLineOption audioStart("audio-start", "Seconds before the audio begins.",
                                        "seconds", "0");
    const QCommandLineOption container("container", "mp4, fmp4, mkv or webm.", "name", "mp4");
    const QCommandLineOption videoCodec("video", "h264, h264-444, hevc, vp8 or vp9.", "codec",
                                        "h264");
    const QCommandLineOption audioCodec("audio", "aac, vorbis or opus.", "codec", "aac");
    const QCommandLineOption audioTracks("audio-tracks", "Audio tracks (1 or 2).", "count", "1");
    const QCommandLineOption start("start", "Seconds the timestamps start at.", "seconds", "0");
    const QCommandLineOption sidx("sidx", "Fragmented MP4: a segment index up front.");
    const QCommandLineOption quiet({"q", "quiet"}, "No progress output.");
    parser.addOptions({size,      fps,        seconds,    noAudio,     rotation, keyint, vfr,
                       truncated, fastStart,  bframes,    preset,      crf,      scene,  audioStart,
                       container, videoCodec, audioCodec, audioTracks, start,    sidx,   quiet});
    parser.process(app);
    av_log_set_level(AV_LOG_ERROR);
    if (parser.positionalArguments().size() != 1)
        parser.showHelp(2);

    testmedia::MovieSpec movieSpec;
    const QStringList wh = parser.value(size).split('x');
    bool ok = wh.size() == 2;
    if (ok) {
        bool okW = false, okH = false;
        movieSpec.width = wh[0].toInt(&okW);
        movieSpec.height = wh[1].toInt(&okH);
        ok = okW && okH;
    }
    if (!ok) {
        std::fprintf(stderr, "tamsel-make-media: bad size '%s'\n", qPrintable(parser.value(size)));
        return 2;
    }
    movieSpec.fps = parser.value(fps).toDouble();
    movieSpec.seconds = parser.value(seconds).toDouble();
    movieSpec.audio = !parser.isSet(noAudio);
    movieSpec.rotationDegrees = parser.value(rotation).toInt();
    movieSpec.keyframeInterval = parser.value(keyint).toInt();
    movieSpec.variableFrameRate = parser.isSet(vfr);
    movieSpec.truncated = parser.isSet(truncated);
    movieSpec.fastStart = parser.isSet(fastStart);
    movieSpec.bFrames = parser.value(bframes).toInt();
    movieSpec.x264Preset = parser.value(preset);
    movieSpec.crf = parser.value(crf).toInt();
    movieSpec.scene = parser.isSet(scene);
    movieSpec.audioStart = parser.value(audioStart).toDouble();
    movieSpec.audioTracks = parser.value(audioTracks).toInt();
    movieSpec.startSeconds = parser.value(start).toDouble();
    movieSpec.segmentIndex = parser.isSet(sidx);
    const QStringList containers = {"mp4", "fmp4", "mkv", "webm"};
    const QStringList videoCodecs = {"h264", "h264-444", "hevc", "vp8", "vp9"};
    const QStringList audioCodecs = {"aac", "vorbis", "opus"};
    const int c = containers.indexOf(parser.value(container));
    const int v = videoCodecs.indexOf(parser.value(videoCodec));
    const int a = audioCodecs.indexOf(parser.value(audioCodec));
    if (c < 0 || v < 0 || a < 0) {
        std::fprintf(stderr, "tamsel-make-media: unknown container or codec\n");
        return 2;
    }
    movieSpec.container = testmedia::Container(c);
    movieSpec.videoCodec = testmedia::VideoCodec(v);
    movieSpec.audioCodec = testmedia::AudioCodec(a);

    const bool showProgress = !parser.isSet(quiet);
    QString error;
    const bool written = testmedia::writeMovie(
        parser.positionalArguments().first(), movieSpec, &error, [&](double done) {
            if (showProgress)
                std::fprintf(stderr, "\r%3d%%", static_cast<int>(done * 100));
        });
    if (showProgress)
        std::fprintf(stderr, "\n");
    if (!written) {
        std::fprintf(stderr, "tamsel-make-media: %s\n", qPrintable(error));
        return 1;
    }
    return 0;
}

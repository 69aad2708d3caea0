// tamsel-bench-export: one export, or one strip of thumbnails, as a whole
// process, so that bench/run can time it with the same harness as cp and
// ffmpeg. Exits 0 only when the work completed.
//
//   tamsel-bench-export [--preset passthrough|highest] [--start S] [--duration D]
//                       [--mix-all] SOURCE OUTPUT
//   tamsel-bench-export --thumbnails N [--size WxH] SOURCE
//
// --start and --duration are seconds, as the editor hands them to the
// session (the duration may run past the end; the session clips it).
// --mix-all sets an audio mix naming every audio track, as the upload does.

#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"
#include "platform/media/ImageGenerator.h"

#include <QCommandLineParser>
#include <QCoreApplication>

#include <condition_variable>
#include <cstdio>
#include <mutex>

using namespace platform;

namespace {

int exportOnce(const std::shared_ptr<Asset>& asset, const QString& preset, const QString& output,
               double start, double duration, bool mixAll) {
    auto session = ExportSession::exportSessionWithAsset_presetName(asset, preset);
    if (!session) {
        std::fprintf(stderr, "tamsel-bench-export: unknown preset\n");
        return 2;
    }
    session->setOutputURL(QUrl::fromLocalFile(output));
    session->setOutputFileType(FileTypeMPEG4);
    if (duration > 0)
        session->setTimeRange(MediaTimeRange::make(MediaTime::fromSeconds(start, 600),
                                                   MediaTime::fromSeconds(duration, 600)));
    if (mixAll) {
        AudioMix mix;
        for (const AssetTrack& track : asset->tracksWithMediaType(MediaType::Audio))
            mix.inputParameters.append(
                AudioMixInputParameters::audioMixInputParametersWithTrack(track));
        session->setAudioMix(mix);
    }
    std::mutex m;
    std::condition_variable cv;
    bool done = false;
    session->exportAsynchronouslyWithCompletionHandler([&] {
        std::lock_guard lock(m);
        done = true;
        cv.notify_all();
    });
    std::unique_lock lock(m);
    cv.wait(lock, [&] { return done; });
    if (session->status() != int(ExportSessionStatus::Completed)) {
        const ErrorPtr error = session->error();
        std::fprintf(stderr, "tamsel-bench-export: export ended with status %d: %s\n",
                     session->status(),
                     error ? qPrintable(error->description()) : "no error given");
        return 1;
    }
    return 0;
}

int thumbnails(const std::shared_ptr<Asset>& asset, int count, const QSizeF& size) {
    const double seconds = asset->duration().seconds();
    QList<MediaTime> times;
    for (int i = 0; i < count; ++i)
        times.append(MediaTime::fromSeconds(seconds * i / count, 600));
    auto generator = ImageGenerator::imageGeneratorWithAsset(asset);
    generator->setMaximumSize(size);
    std::mutex m;
    std::condition_variable cv;
    int done = 0, failed = 0;
    generator->generateImagesAsynchronouslyForTimes_completionHandler(
        times, [&](MediaTime, QImage, MediaTime, ImageGeneratorResult result, ErrorPtr) {
            std::lock_guard lock(m);
            ++done;
            failed += result != ImageGeneratorResult::Succeeded;
            cv.notify_all();
        });
    std::unique_lock lock(m);
    cv.wait(lock, [&] { return done == count; });
    if (failed) {
        std::fprintf(stderr, "tamsel-bench-export: %d thumbnails failed\n", failed);
        return 1;
    }
    return 0;
}

} // namespace

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription("One export or one strip of thumbnails, for bench/run.");
    parser.addHelpOption();
    const QCommandLineOption preset("preset", "passthrough or highest.", "name", "passthrough");
    const QCommandLineOption start("start", "Start of the range, seconds.", "seconds", "0");
    const QCommandLineOption duration("duration", "Duration of the range, seconds.", "seconds",
                                      "0");
    const QCommandLineOption mixAll("mix-all", "An audio mix naming every audio track.");
    const QCommandLineOption thumbs("thumbnails", "Make N thumbnails instead.", "N");
    const QCommandLineOption size("size", "Thumbnail box, WxH.", "WxH", "68x38");
    parser.addOptions({preset, start, duration, mixAll, thumbs, size});
    parser.addPositionalArgument("source", "The recording.");
    parser.addPositionalArgument("output", "The clip to write (not with --thumbnails).");
    parser.process(app);
    const QStringList args = parser.positionalArguments();
    const bool strip = parser.isSet(thumbs);
    if (args.size() != (strip ? 1 : 2))
        parser.showHelp(2);

    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(args[0]));
    if (asset->error()) {
        std::fprintf(stderr, "tamsel-bench-export: %s\n",
                     qPrintable(asset->error()->description()));
        return 1;
    }
    if (strip) {
        const QStringList wh = parser.value(size).split(QLatin1Char('x'));
        return thumbnails(asset, parser.value(thumbs).toInt(),
                          wh.size() == 2 ? QSizeF(wh[0].toDouble(), wh[1].toDouble())
                                         : QSizeF(68, 38));
    }
    const QString presetName = parser.value(preset) == QLatin1String("highest")
                                   ? ExportPresetHighestQuality
                                   : ExportPresetPassthrough;
    return exportOnce(asset, presetName, args[1], parser.value(start).toDouble(),
                      parser.value(duration).toDouble(), parser.isSet(mixAll));
}

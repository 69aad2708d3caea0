// A recording as the editor meets it: the asset's headers, one thumbnail,
// and a one-second pass-through export, from whatever bytes the file holds
// (MP4, fragmented MP4, Matroska and WebM seeds, mutated).

#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"
#include "platform/media/ImageGenerator.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <QUrl>
#include <cstdint>
#include <future>

using namespace platform;

namespace {

QTemporaryDir& scratch() {
    static QTemporaryDir dir;
    return dir;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const QString movie = scratch().filePath(QStringLiteral("recording.mp4"));
    const QString clip = scratch().filePath(QStringLiteral("clip.mp4"));
    {
        QFile file(movie);
        if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate))
            return 0;
        file.write(reinterpret_cast<const char*>(data), qint64(size));
    }
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(movie));
    if (asset->tracks().isEmpty())
        return 0;
    (void)asset->duration();

    const auto generator = ImageGenerator::imageGeneratorWithAsset(asset);
    generator->setMaximumSize(QSizeF(64, 64));
    generator->setAppliesPreferredTrackTransform(true);
    std::promise<void> imaged;
    generator->generateImagesAsynchronouslyForTimes_completionHandler(
        {MediaTime::fromSeconds(0.5, 600)},
        [&imaged](MediaTime, QImage, MediaTime, ImageGeneratorResult, ErrorPtr) {
            imaged.set_value();
        });
    imaged.get_future().wait();

    QFile::remove(clip);
    const auto session =
        ExportSession::exportSessionWithAsset_presetName(asset, ExportPresetPassthrough);
    if (!session)
        return 0;
    session->setOutputURL(QUrl::fromLocalFile(clip));
    session->setOutputFileType(FileTypeMPEG4);
    session->setTimeRange(
        MediaTimeRange::make(MediaTime::fromSeconds(0.2, 600), MediaTime::fromSeconds(1, 600)));
    std::promise<void> exported;
    session->exportAsynchronouslyWithCompletionHandler([&exported] { exported.set_value(); });
    exported.get_future().wait();
    // A clip that came out must open again.
    if (session->status() != int(ExportSessionStatus::Failed) && QFile::exists(clip))
        (void)Asset::assetWithURL(QUrl::fromLocalFile(clip))->tracks();
    return 0;
}

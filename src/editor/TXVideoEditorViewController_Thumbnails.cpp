// The editor as the scrubber's data source: time stamps, thumbnails and the
// measurements they need.

#include "TXVideoEditorViewController.h"

#include "platform/runtime/MainQueue.h"
#include "platform/ui/Screen.h"

#include <cmath>

using namespace platform;

QList<double> TXVideoEditorViewController::movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(
    MovieScrubber* scrubber, int count, double start, double end) {
    if (end == 0.0)
        return {0.0};
    QList<double> stamps;
    stamps.reserve(qMax(count, 0));
    const double duration = getPlayerDuration();
    double t = start;
    if (count >= 1) {
        const double step = (end - start) / count;
        // The stop test follows the append and reads the player's duration,
        // so a range past the end still gets the stamp at the end itself.
        for (int i = 1;; ++i) {
            stamps.append(t);
            t = t + step;
            if (t > duration || i >= count)
                break;
        }
    }
    return stamps;
}

QSizeF TXVideoEditorViewController::getVideoSize() {
    const auto& item = avPlayer->currentItem();
    const QList<AssetTrack> tracks =
        item ? item->asset()->tracksWithMediaType(MediaType::Video) : QList<AssetTrack>();
    if (tracks.isEmpty())
        return QSizeF(0, 0);
    const float w = float(tracks.first().naturalSize.width());
    const float h = float(tracks.first().naturalSize.height());
    const QTransform& t = tracks.first().preferredTransform;
    return QSizeF(std::fabs(w * float(t.m11()) + h * float(t.m21())),
                  std::fabs(w * float(t.m12()) + h * float(t.m22())));
}

float TXVideoEditorViewController::movieScrubberThumbnailAspectRatio(MovieScrubber* scrubber) {
    const QSizeF size = getVideoSize();
    if (size.width() > 0 && size.height() > 0)
        return float(size.width() / size.height());
    return 1.0f;
}

QSizeF TXVideoEditorViewController::getThumbnailSize() {
    const QSizeF videoSize = getVideoSize();
    const float ratio = float(videoSize.width()) / float(videoSize.height());
    const float scale = float(Screen::mainScreen().scale());
    const float height = 38.0f * scale;
    // The width takes the scale twice, the height once.
    return QSizeF(std::rint(ratio * 38.0f * scale) * scale, height);
}

double TXVideoEditorViewController::getPlayerDuration() {
    const auto& item = avPlayer->currentItem();
    if (!item || item->status() != PlayerItem::Status::ReadyToPlay)
        return MediaTime::invalid().seconds();
    const QList<MediaTimeRange> ranges = item->loadedTimeRanges();
    if (ranges.isEmpty())
        return MediaTime::invalid().seconds();
    return ranges.first().start.seconds() + ranges.first().duration.seconds();
}

double TXVideoEditorViewController::movieScrubberDuration(MovieScrubber* scrubber) {
    return getPlayerDuration();
}

void TXVideoEditorViewController::movieScrubber_requestThumbnailImageForTimestamp(
    MovieScrubber* scrubber, double timestamp) {
    if (!thumbnailGenerator) {
        const auto& item = avPlayer->currentItem();
        thumbnailGenerator =
            ImageGenerator::imageGeneratorWithAsset(item ? item->asset() : avAsset);
        thumbnailGenerator->setMaximumSize(getThumbnailSize());
    }
    if (!cachedTimeStamps)
        cachedTimeStamps = std::make_shared<QHash<double, QImage>>();
    if (cachedTimeStamps->contains(timestamp)) {
        setThumbnailFromCacheWithTimeStamp(timestamp);
        return;
    }
    const MediaTime time = MediaTime::fromSeconds(timestamp, 600);
    thumbnailGenerator->generateImagesAsynchronouslyForTimes_completionHandler(
        {time}, [editor = self(), timestamp](MediaTime, QImage image, MediaTime,
                                             ImageGeneratorResult, ErrorPtr error) mutable {
            // The editor is a view controller: its last reference must go on
            // the main thread, so this one is handed over there.
            if (error) {
                MainQueue::async([editor = std::move(editor)] {});
                return;
            }
            // The cache belongs to the main thread, so the image is stored
            // there, into whichever cache the editor holds by then.
            MainQueue::async([editor = std::move(editor), timestamp, image] {
                if (!editor->cachedTimeStamps)
                    return;
                editor->cachedTimeStamps->insert(timestamp, image);
                editor->setThumbnailFromCacheWithTimeStamp(timestamp);
            });
        });
}

void TXVideoEditorViewController::setThumbnailFromCacheWithTimeStamp(double timestamp) {
    MainQueue::async([editor = self(), timestamp] {
        const QImage image =
            editor->cachedTimeStamps ? editor->cachedTimeStamps->value(timestamp) : QImage();
        editor->avTrimmer->setThumbnailImage_forTimestamp(image, timestamp);
    });
}

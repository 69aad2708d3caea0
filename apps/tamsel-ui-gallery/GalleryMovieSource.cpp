#include "GalleryMovieSource.h"

#include "MediaGenerator.h"
#include "platform/media/Asset.h"
#include "platform/media/ImageGenerator.h"
#include "platform/runtime/MainQueue.h"

#include <QPointer>
#include <QUrl>

using platform::MediaTime;
using platform::MovieScrubber;

namespace {
constexpr double kThumbnailHeight = 38.0 * 2; // points at a generous scale
}

GalleryMovieSource::GalleryMovieSource() {
    testmedia::MovieSpec movie;
    movie.width = 480;
    movie.height = 270;
    movie.seconds = 6;
    movie.audio = false;
    movie.scene = true;
    const QString path = directory_.filePath(QStringLiteral("gallery.mp4"));
    if (!directory_.isValid() || !testmedia::writeMovie(path, movie, &error_))
        return;
    auto asset = platform::Asset::assetWithURL(QUrl::fromLocalFile(path));
    if (asset->error() || asset->tracksWithMediaType(platform::MediaType::Video).isEmpty()) {
        error_ = asset->error() ? asset->error()->description() : QStringLiteral("no video track");
        return;
    }
    asset_ = asset;
    duration_ = asset->duration().seconds();
    const QSizeF size = asset->tracksWithMediaType(platform::MediaType::Video).first().naturalSize;
    aspect_ = size.height() > 0 ? float(size.width() / size.height()) : 1.0f;
    generator_ = platform::ImageGenerator::imageGeneratorWithAsset(asset);
    generator_->setMaximumSize(QSizeF(kThumbnailHeight * aspect_, kThumbnailHeight));
}

QImage GalleryMovieSource::frameAt(double seconds) const {
    if (!asset_)
        return {};
    auto generator = platform::ImageGenerator::imageGeneratorWithAsset(asset_);
    return generator->copyImageAtTime_actualTime_error(MediaTime::fromSeconds(seconds, 600),
                                                       nullptr, nullptr);
}

double GalleryMovieSource::movieScrubberDuration(MovieScrubber*) {
    return duration_;
}

float GalleryMovieSource::movieScrubberThumbnailAspectRatio(MovieScrubber*) {
    return aspect_;
}

QList<double> GalleryMovieSource::movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(
    MovieScrubber*, int count, double start, double end) {
    QList<double> stamps;
    for (int i = 0; i < count; ++i)
        stamps.append(start + i * (end - start) / count);
    asked_ = true;
    waiting_ = stamps;
    return stamps;
}

void GalleryMovieSource::movieScrubber_requestThumbnailImageForTimestamp(MovieScrubber* scrubber,
                                                                         double timestamp) {
    if (!generator_)
        return;
    QPointer<MovieScrubber> target(scrubber);
    std::weak_ptr<GalleryMovieSource> weak = weak_from_this();
    generator_->generateImagesAsynchronouslyForTimes_completionHandler(
        {MediaTime::fromSeconds(timestamp, 600)},
        [target, weak, timestamp](MediaTime, QImage image, MediaTime,
                                  platform::ImageGeneratorResult, platform::ErrorPtr) {
            platform::MainQueue::async([target, weak, timestamp, image] {
                auto self = weak.lock();
                if (!target || !self || image.isNull())
                    return;
                target->setThumbnailImage_forTimestamp(image, timestamp);
                self->waiting_.removeAll(timestamp);
            });
        });
}

void GalleryMovieSource::report(const QString& line) {
    if (onReport)
        onReport(line);
}

static QString handleName(platform::MovieScrubberHandle handle) {
    switch (handle) {
    case platform::MovieScrubberHandle::Playhead:
        return QStringLiteral("playhead");
    case platform::MovieScrubberHandle::Start:
        return QStringLiteral("start");
    case platform::MovieScrubberHandle::End:
        return QStringLiteral("end");
    }
    return {};
}

void GalleryMovieSource::movieScrubber_valueDidChange(MovieScrubber*, double value) {
    report(QStringLiteral("value %1 s").arg(value, 0, 'f', 3));
}

void GalleryMovieSource::movieScrubberDidBeginScrubbing_withHandle(
    MovieScrubber*, platform::MovieScrubberHandle handle) {
    report(QStringLiteral("begin scrubbing (%1)").arg(handleName(handle)));
}

void GalleryMovieSource::movieScrubberDidEndScrubbing_withHandle(
    MovieScrubber*, platform::MovieScrubberHandle handle) {
    report(QStringLiteral("end scrubbing (%1)").arg(handleName(handle)));
}

void GalleryMovieSource::movieScrubberDidBeginEditing(MovieScrubber*) {
    report(QStringLiteral("begin editing"));
}

void GalleryMovieSource::movieScrubber_editingStartValueDidChange(MovieScrubber*, double value) {
    report(QStringLiteral("start %1 s").arg(value, 0, 'f', 3));
}

void GalleryMovieSource::movieScrubber_editingEndValueDidChange(MovieScrubber*, double value) {
    report(QStringLiteral("end %1 s").arg(value, 0, 'f', 3));
}

void GalleryMovieSource::movieScrubberDidCancelEditing(MovieScrubber*) {
    report(QStringLiteral("cancel editing"));
}

#pragma once

#include "platform/ui/scrubber/MovieScrubber.h"

#include <QImage>
#include <QList>
#include <QString>
#include <QTemporaryDir>
#include <functional>
#include <memory>

namespace platform {
class Asset;
class ImageGenerator;
} // namespace platform

// The gallery's movie: a short recording generated into a temporary folder at
// start, and the scrubber's data source and delegate over it. Thumbnails are
// decoded on a worker thread and handed to the scrubber on the main queue.
// The delegate side reports each call as one line of text. Main thread only.
class GalleryMovieSource : public platform::MovieScrubberDataSource,
                           public platform::MovieScrubberDelegate,
                           public std::enable_shared_from_this<GalleryMovieSource> {
  public:
    // Generates the movie; on failure the source has no movie (duration 0)
    // and error() says why.
    GalleryMovieSource();

    bool hasMovie() const { return bool(asset_); }
    QString error() const { return error_; }
    // A frame of the movie at `seconds`, at its own size; null without one.
    QImage frameAt(double seconds) const;
    // Whether every thumbnail of the scrubber's last reload has arrived.
    bool thumbnailsComplete() const { return asked_ && waiting_.isEmpty(); }

    std::function<void(const QString&)> onReport;

    double movieScrubberDuration(platform::MovieScrubber*) override;
    float movieScrubberThumbnailAspectRatio(platform::MovieScrubber*) override;
    QList<double> movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(platform::MovieScrubber*,
                                                                           int count, double start,
                                                                           double end) override;
    void movieScrubber_requestThumbnailImageForTimestamp(platform::MovieScrubber* scrubber,
                                                         double timestamp) override;
    double movieScrubberFrameDuration(platform::MovieScrubber*) override { return 1.0 / 30.0; }

    void movieScrubber_valueDidChange(platform::MovieScrubber*, double value) override;
    void movieScrubberDidBeginScrubbing_withHandle(platform::MovieScrubber*,
                                                   platform::MovieScrubberHandle) override;
    void movieScrubberDidEndScrubbing_withHandle(platform::MovieScrubber*,
                                                 platform::MovieScrubberHandle) override;
    void movieScrubberDidBeginEditing(platform::MovieScrubber*) override;
    void movieScrubber_editingStartValueDidChange(platform::MovieScrubber*, double value) override;
    void movieScrubber_editingEndValueDidChange(platform::MovieScrubber*, double value) override;
    void movieScrubberDidCancelEditing(platform::MovieScrubber*) override;

  private:
    void report(const QString& line);

    QTemporaryDir directory_;
    std::shared_ptr<platform::Asset> asset_;
    std::shared_ptr<platform::ImageGenerator> generator_;
    QString error_;
    double duration_ = 0.0;
    float aspect_ = 1.0f;
    bool asked_ = false;
    QList<double> waiting_; // stamps of the last reload not yet delivered
};

#pragma once

#include "platform/media/ExportSession.h"
#include "platform/media/MediaTime.h"

#include <QHash>
#include <QList>
#include <QSize>
#include <QSizeF>
#include <QString>
#include <QUrl>

#include <cstdint>
#include <mutex>
#include <optional>

namespace fakes {

// A movie of the fake world: it exists only here, never on disk.
struct FakeMovie {
    double seconds = 10;
    QSize size{320, 240};
    int rotationDegrees = 0; // the display matrix's turn, clockwise
    bool video = true;
    bool audio = true;
    std::int32_t timescale = 600;
};

// What the fakes share: the movies at their URLs, how exports end, and a
// record of what was asked of the services. Any thread; each call is atomic.
class FakeWorld {
  public:
    void addMovie(const QUrl& url, const FakeMovie& movie);
    std::optional<FakeMovie> movieAt(const QUrl& url) const;

    // How the next exports end: Completed (the clip then exists at the output
    // URL), or Failed with `errorCode`, or Cancelled.
    void setExportOutcome(platform::ExportSessionStatus status, int errorCode = 0);
    std::pair<platform::ExportSessionStatus, int> exportOutcome() const;

    struct Export {
        QUrl source;
        QString presetName;
        QUrl output;
        QString fileType;
        platform::MediaTimeRange range;
    };
    void recordExport(const Export& exported);
    QList<Export> exports() const;

    // Every time an image generator was asked for, in seconds, and the box
    // it was to fit in.
    void recordGeneration(double seconds, const QSizeF& maximumSize);
    QList<double> generatedTimes() const;
    QSizeF lastMaximumSize() const;
    // Times whose generation fails (the frame cannot be decoded).
    void failGenerationAt(double seconds);
    bool generationFailsAt(double seconds) const;

    // What reached the album: the device paths of the videos it took in.
    void recordAlbumImport(const QString& devicePath);
    QStringList albumImports() const;

  private:
    mutable std::mutex mutex_;
    QHash<QString, FakeMovie> movies_;
    platform::ExportSessionStatus exportStatus_ = platform::ExportSessionStatus::Completed;
    int exportError_ = 0;
    QList<Export> exports_;
    QList<double> generated_;
    QSizeF maximumSize_;
    QList<double> failingTimes_;
    QStringList albumImports_;
};

} // namespace fakes

#pragma once

#include "platform/media/ExportSession.h"
#include "platform/media/MediaTime.h"

#include <QHash>
#include <QList>
#include <QSizeF>
#include <QStringList>
#include <QUrl>

#include <mutex>
#include <optional>

namespace fakes {

// A movie of the fake world: it exists only here, never on disk. Its times
// are at a timescale of 600, its audio at 48 kHz.
struct FakeMovie {
    double seconds = 10;
    QSize size{320, 240};
    int rotationDegrees = 0; // the display matrix's turn, clockwise
    bool video = true;
};

// What the fakes share: the movies at their URLs (found by path, so a device
// path and its file URL name the same movie), how exports end, and a record
// of what was asked of the services. Any thread: state() is a copy taken
// under the lock, change() runs under it.
class FakeWorld {
  public:
    struct Export {
        QUrl source;
        QString presetName;
        QUrl output;
        QString fileType;
        platform::MediaTimeRange range;
    };
    struct State {
        QHash<QString, FakeMovie> movies;
        // How exports end: Completed (the clip then exists at the output
        // URL), Failed with `exportError`, or Cancelled.
        platform::ExportSessionStatus exportStatus = platform::ExportSessionStatus::Completed;
        int exportError = 0;
        QList<Export> exports;
        QList<double> generatedTimes; // every image asked for, in seconds
        QSizeF lastMaximumSize;       // the box the last one was to fit in
        QList<double> failingTimes;   // times whose frame cannot be decoded
        QStringList albumImports;     // device paths of the videos the album took in
    };

    State state() const {
        std::lock_guard lock(mutex_);
        return state_;
    }
    template <typename Change> void change(Change&& change) {
        std::lock_guard lock(mutex_);
        change(state_);
    }
    void addMovie(const QUrl& url, const FakeMovie& movie) {
        change([&](State& s) { s.movies.insert(keyOf(url), movie); });
    }
    std::optional<FakeMovie> movieAt(const QUrl& url) const {
        std::lock_guard lock(mutex_);
        const auto found = state_.movies.constFind(keyOf(url));
        return found == state_.movies.cend() ? std::nullopt : std::optional(*found);
    }

  private:
    static QString keyOf(const QUrl& url) {
        return url.isLocalFile() ? url.toLocalFile() : url.toString();
    }

    mutable std::mutex mutex_;
    State state_;
};

} // namespace fakes

#include "FakeWorld.h"

namespace fakes {

namespace {
// Movies are found by path, so a device path and its file URL name the same.
QString keyOf(const QUrl& url) {
    return url.isLocalFile() ? url.toLocalFile() : url.toString();
}
} // namespace

void FakeWorld::addMovie(const QUrl& url, const FakeMovie& movie) {
    std::lock_guard lock(mutex_);
    movies_.insert(keyOf(url), movie);
}

std::optional<FakeMovie> FakeWorld::movieAt(const QUrl& url) const {
    std::lock_guard lock(mutex_);
    const auto found = movies_.constFind(keyOf(url));
    if (found == movies_.cend())
        return std::nullopt;
    return *found;
}

void FakeWorld::setExportOutcome(platform::ExportSessionStatus status, int errorCode) {
    std::lock_guard lock(mutex_);
    exportStatus_ = status;
    exportError_ = errorCode;
}

std::pair<platform::ExportSessionStatus, int> FakeWorld::exportOutcome() const {
    std::lock_guard lock(mutex_);
    return {exportStatus_, exportError_};
}

void FakeWorld::recordExport(const Export& exported) {
    std::lock_guard lock(mutex_);
    exports_.append(exported);
}

QList<FakeWorld::Export> FakeWorld::exports() const {
    std::lock_guard lock(mutex_);
    return exports_;
}

void FakeWorld::recordGeneration(double seconds, const QSizeF& maximumSize) {
    std::lock_guard lock(mutex_);
    generated_.append(seconds);
    maximumSize_ = maximumSize;
}

QList<double> FakeWorld::generatedTimes() const {
    std::lock_guard lock(mutex_);
    return generated_;
}

QSizeF FakeWorld::lastMaximumSize() const {
    std::lock_guard lock(mutex_);
    return maximumSize_;
}

void FakeWorld::failGenerationAt(double seconds) {
    std::lock_guard lock(mutex_);
    failingTimes_.append(seconds);
}

bool FakeWorld::generationFailsAt(double seconds) const {
    std::lock_guard lock(mutex_);
    return failingTimes_.contains(seconds);
}

void FakeWorld::recordAlbumImport(const QString& devicePath) {
    std::lock_guard lock(mutex_);
    albumImports_.append(devicePath);
}

QStringList FakeWorld::albumImports() const {
    std::lock_guard lock(mutex_);
    return albumImports_;
}

} // namespace fakes

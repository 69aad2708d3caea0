#include "FakeExportSession.h"

#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"

#include <cerrno>

using namespace platform;

namespace fakes {

MediaTimeRange FakeExportSession::timeRange() const {
    return range_.value_or(MediaTimeRange::make(MediaTime::zero(), asset_->duration()));
}

void FakeExportSession::exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) {
    if (started_.exchange(true)) {
        logError(QStringLiteral("ExportSession: an export session exports only once"));
        return;
    }
    status_ = int(ExportSessionStatus::Waiting);
    GlobalQueue::async(QueuePriority::Default,
                       [self = shared_from_this(), handler = std::move(handler)] {
                           self->run();
                           if (handler)
                               handler();
                       });
}

void FakeExportSession::run() {
    status_ = int(ExportSessionStatus::Exporting);
    const MediaTimeRange range = timeRange();
    world_->change([&](FakeWorld::State& s) {
        s.exports.append({asset_->url(), preset_, outputURL_, fileType_, range});
    });
    const FakeWorld::State world = world_->state();
    ExportSessionStatus status = cancelled_ ? ExportSessionStatus::Cancelled : world.exportStatus;
    std::optional<FakeMovie> clip = world_->movieAt(asset_->url());
    const double end = clip ? std::min(range.end().seconds(), clip->seconds) : 0;
    ErrorPtr failure;
    if (!clip || !range.start.isNumeric() || !(end > range.start.seconds()))
        failure = makeError(-EINVAL, mediaErrorDomain(), QStringLiteral("nothing to export"));
    else if (status == ExportSessionStatus::Failed)
        failure = makeError(world.exportError, mediaErrorDomain(), QStringLiteral("export failed"));
    if (failure && status != ExportSessionStatus::Cancelled) {
        status = ExportSessionStatus::Failed;
        error_ = failure;
    }
    if (status == ExportSessionStatus::Completed) {
        clip->seconds = end - range.start.seconds();
        world_->addMovie(outputURL_, *clip);
    }
    status_ = int(status);
}

} // namespace fakes

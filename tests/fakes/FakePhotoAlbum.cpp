#include "FakePhotoAlbum.h"

#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"

using namespace platform;

namespace fakes {

namespace {
// What the real album does with one video, minus the copy.
ErrorPtr import(FakeWorld& world, const QString& devicePath) {
    if (!world.movieAt(QUrl::fromLocalFile(devicePath)))
        return makeError(PhotoAlbum::NotVideo, QStringLiteral("PhotoAlbum"),
                         QStringLiteral("%1 is not a playable video").arg(devicePath));
    world.change([&](FakeWorld::State& s) { s.albumImports.append(devicePath); });
    return nullptr;
}
} // namespace

void FakePhotoAlbum::performChanges_creationRequestForAssetFromVideoAtFileURL(
    const QUrl& fileURL, Completion completion) {
    GlobalQueue::async(
        QueuePriority::Default, [world = world_, fileURL, completion = std::move(completion)] {
            const QString path = fileURL.isLocalFile() ? fileURL.toLocalFile() : fileURL.toString();
            const ErrorPtr error = import(*world, path);
            if (completion)
                completion(!error, error);
        });
}

void FakePhotoAlbum::saveVideoAtPathToAlbum(const QString& path) {
    GlobalQueue::async(QueuePriority::Default, [world = world_, path] {
        if (const ErrorPtr error = import(*world, path))
            logError(QStringLiteral("photo album: %1").arg(error->description()));
    });
}

} // namespace fakes

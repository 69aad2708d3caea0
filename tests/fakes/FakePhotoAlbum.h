#pragma once

#include "FakeWorld.h"
#include "platform/services/album/PhotoAlbum.h"

namespace fakes {

// An album that takes in the world's movies and writes nothing: a video the
// world holds is recorded as imported; anything else is refused with the
// real album's NotVideo error (and, for a save by path, its log line). Work
// and completions run on a worker thread of GlobalQueue, as the real album's.
class FakePhotoAlbum final : public platform::PhotoAlbum {
  public:
    explicit FakePhotoAlbum(std::shared_ptr<FakeWorld> world) : world_(std::move(world)) {}

    void performChanges_creationRequestForAssetFromVideoAtFileURL(const QUrl& fileURL,
                                                                  Completion completion) override;
    void saveVideoAtPathToAlbum(const QString& path) override;

  private:
    const std::shared_ptr<FakeWorld> world_;
};

} // namespace fakes

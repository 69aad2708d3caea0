#pragma once

#include "FakeWorld.h"
#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"
#include "platform/media/ImageGenerator.h"
#include "platform/media/playback/Player.h"
#include "platform/media/playback/PlayerItem.h"
#include "platform/media/playback/PlayerLayer.h"
#include "platform/services/album/PhotoAlbum.h"

#include <memory>

namespace fakes {

class FakePhotoAlbum;

// Puts the fakes in place of the media services and the photo album for its
// lifetime: assets, player items, players, player layers, image generators,
// export sessions and the shared album all come from here and share one
// FakeWorld. Nothing touches a file's bytes, FFmpeg or libmpv. Make it on the
// main thread, before the code under test asks for a service; what was made
// before stays what it is.
class FakePlatform {
  public:
    FakePlatform();
    ~FakePlatform();
    FakePlatform(const FakePlatform&) = delete;
    FakePlatform& operator=(const FakePlatform&) = delete;

    FakeWorld& world() const { return *world_; }

  private:
    template <typename Signature>
    using Replacement = typename platform::Implementation<Signature>::Replacement;

    std::shared_ptr<FakeWorld> world_;
    std::shared_ptr<FakePhotoAlbum> album_;
    Replacement<platform::Asset::Maker> asset_;
    Replacement<platform::PlayerItem::Maker> playerItem_;
    Replacement<platform::Player::Maker> player_;
    Replacement<platform::PlayerLayer::Maker> playerLayer_;
    Replacement<platform::ImageGenerator::Maker> imageGenerator_;
    Replacement<platform::ExportSession::Maker> exportSession_;
    Replacement<platform::PhotoAlbum::Maker> photoAlbum_;
};

} // namespace fakes

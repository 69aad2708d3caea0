#include "FakePlatform.h"

#include "FakeAsset.h"
#include "FakeExportSession.h"
#include "FakeImageGenerator.h"
#include "FakePhotoAlbum.h"
#include "FakePlayer.h"
#include "FakePlayerItem.h"
#include "FakePlayerLayer.h"

using namespace platform;

namespace fakes {

FakePlatform::FakePlatform()
    : world_(std::make_shared<FakeWorld>()), album_(std::make_shared<FakePhotoAlbum>(world_)),
      asset_(Asset::implementation().replace([world = world_](const QUrl& url) {
          return std::shared_ptr<Asset>(std::make_shared<FakeAsset>(url, world->movieAt(url)));
      })),
      playerItem_(PlayerItem::implementation().replace([](std::shared_ptr<Asset> asset) {
          return std::shared_ptr<PlayerItem>(std::make_shared<FakePlayerItem>(std::move(asset)));
      })),
      player_(Player::implementation().replace([](std::shared_ptr<PlayerItem> item) {
          return std::shared_ptr<Player>(FakePlayer::make(std::move(item)));
      })),
      playerLayer_(PlayerLayer::implementation().replace(
          [](QWidget* parent) -> PlayerLayer* { return new FakePlayerLayer(parent); })),
      imageGenerator_(
          ImageGenerator::implementation().replace([world = world_](std::shared_ptr<Asset> asset) {
              return std::shared_ptr<ImageGenerator>(
                  std::make_shared<FakeImageGenerator>(std::move(asset), world));
          })),
      exportSession_(ExportSession::implementation().replace(
          [world = world_](std::shared_ptr<Asset> asset,
                           const QString& presetName) -> std::shared_ptr<ExportSession> {
              if (presetName != ExportPresetPassthrough && presetName != ExportPresetHighestQuality)
                  return nullptr;
              return std::make_shared<FakeExportSession>(std::move(asset), presetName, world);
          })),
      photoAlbum_(PhotoAlbum::implementation().replace(
          [album = album_]() -> std::shared_ptr<PhotoAlbum> { return album; })) {}

FakePlatform::~FakePlatform() = default;

} // namespace fakes

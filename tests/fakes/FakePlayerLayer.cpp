#include "FakePlayerLayer.h"

#include <QPalette>

using namespace platform;

namespace fakes {

FakePlayerLayer::FakePlayerLayer(QWidget* parent) : PlayerLayer(parent) {
    QPalette palette = this->palette();
    palette.setColor(QPalette::Window, Qt::black);
    setPalette(palette);
    setAutoFillBackground(true);
}

bool FakePlayerLayer::isReadyForDisplay() const {
    const std::shared_ptr<PlayerItem> item = player_ ? player_->currentItem() : nullptr;
    return item && item->status() == PlayerItem::Status::ReadyToPlay;
}

} // namespace fakes

#include "MpvPlayerLayer.h"

#include "MpvPlayer.h"
#include "VideoSurface.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <QPalette>
#include <QPointer>

namespace platform {

Implementation<PlayerLayer::Maker>& PlayerLayer::implementation() {
    static Implementation<Maker> chosen(
        [](QWidget* parent) -> PlayerLayer* { return new MpvPlayerLayer(parent); });
    return chosen;
}

PlayerLayer* PlayerLayer::playerLayerWithPlayer(std::shared_ptr<Player> player, QWidget* parent) {
    PlayerLayer* layer = implementation().make(parent);
    layer->setPlayer(std::move(player));
    return layer;
}

MpvPlayerLayer::MpvPlayerLayer(QWidget* parent) : PlayerLayer(parent) {
    QPalette palette = this->palette();
    palette.setColor(QPalette::Window, Qt::black);
    setPalette(palette);
    setAutoFillBackground(true);
    makeSurface(int(VideoSurface::preferredKind()));
}

MpvPlayerLayer::~MpvPlayerLayer() {
    // The surface gives the renderer back while the player is still held.
    surface_.reset();
    player_.reset();
}

void MpvPlayerLayer::makeSurface(int kind) {
    surface_ = VideoSurface::create(VideoSurface::Kind(kind), this);
    surface_->widget()->setGeometry(rect());
    surface_->widget()->show();
    if (VideoSurface::Kind(kind) == VideoSurface::Kind::OpenGL) {
        surface_->onFailed = [this] {
            // Queued: the surface is still inside its own call.
            MainQueue::async([layer = QPointer<MpvPlayerLayer>(this)] {
                if (!layer)
                    return;
                logError(QStringLiteral("player: OpenGL video failed, drawing in software"));
                layer->makeSurface(int(VideoSurface::Kind::Software));
                layer->surface_->setPlayer(std::dynamic_pointer_cast<MpvPlayer>(layer->player_));
            });
        };
    }
}

void MpvPlayerLayer::setPlayer(std::shared_ptr<Player> player) {
    if (player == player_)
        return;
    player_ = std::move(player);
    surface_->setPlayer(std::dynamic_pointer_cast<MpvPlayer>(player_));
}

bool MpvPlayerLayer::isReadyForDisplay() const {
    return surface_->hasFrame();
}

bool MpvPlayerLayer::usesOpenGL() const {
    return surface_->kind() == VideoSurface::Kind::OpenGL;
}

void MpvPlayerLayer::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    surface_->widget()->setGeometry(rect());
}

} // namespace platform

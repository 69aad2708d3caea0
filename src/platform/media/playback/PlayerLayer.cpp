#include "PlayerLayer.h"

#include "VideoSurface.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <QPalette>
#include <QPointer>

namespace platform {

PlayerLayer::PlayerLayer(QWidget* parent) : QWidget(parent) {
    QPalette palette = this->palette();
    palette.setColor(QPalette::Window, Qt::black);
    setPalette(palette);
    setAutoFillBackground(true);
    makeSurface(int(VideoSurface::preferredKind()));
}

PlayerLayer::~PlayerLayer() {
    // The surface gives the renderer back while the player is still held.
    surface_.reset();
    player_.reset();
}

PlayerLayer* PlayerLayer::playerLayerWithPlayer(std::shared_ptr<Player> player, QWidget* parent) {
    auto* layer = new PlayerLayer(parent);
    layer->setPlayer(std::move(player));
    return layer;
}

void PlayerLayer::makeSurface(int kind) {
    surface_ = VideoSurface::create(VideoSurface::Kind(kind), this);
    surface_->widget()->setGeometry(rect());
    surface_->widget()->show();
    if (VideoSurface::Kind(kind) == VideoSurface::Kind::OpenGL) {
        surface_->onFailed = [this] {
            // Queued: the surface is still inside its own call.
            MainQueue::async([layer = QPointer<PlayerLayer>(this)] {
                if (!layer)
                    return;
                logError(QStringLiteral("player: OpenGL video failed, drawing in software"));
                layer->makeSurface(int(VideoSurface::Kind::Software));
                layer->surface_->setPlayer(layer->player_);
            });
        };
    }
}

void PlayerLayer::setPlayer(std::shared_ptr<Player> player) {
    if (player == player_)
        return;
    player_ = std::move(player);
    surface_->setPlayer(player_);
}

bool PlayerLayer::isReadyForDisplay() const {
    return surface_->hasFrame();
}

bool PlayerLayer::usesOpenGL() const {
    return surface_->kind() == VideoSurface::Kind::OpenGL;
}

void PlayerLayer::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    surface_->widget()->setGeometry(rect());
}

} // namespace platform

#include "OpenGLVideoSurface.h"

#include "MpvCore.h"
#include "MpvPlayer.h"

#include <QOpenGLContext>

#include <mpv/render_gl.h>

namespace platform {

namespace {

void* procAddress(void*, const char* name) {
    QOpenGLContext* context = QOpenGLContext::currentContext();
    return context ? reinterpret_cast<void*>(context->getProcAddress(name)) : nullptr;
}

} // namespace

OpenGLVideoSurface::OpenGLVideoSurface(QWidget* parent) : QOpenGLWidget(parent) {}

OpenGLVideoSurface::~OpenGLVideoSurface() {
    detach();
}

void OpenGLVideoSurface::setPlayer(const std::shared_ptr<MpvPlayer>& player) {
    detach();
    player_ = player;
    frameSeen_ = false;
    hasFrame_ = false;
    if (glReady_)
        attach();
    QOpenGLWidget::update();
}

void OpenGLVideoSurface::initializeGL() {
    glReady_ = true;
    attach();
}

void OpenGLVideoSurface::attach() {
    const std::shared_ptr<MpvPlayer> player = player_.lock();
    if (!player || !player->mpvCore() || attachment_ != 0)
        return;
    makeCurrent();
    mpv_opengl_init_params init{&procAddress, nullptr};
    mpv_render_param params[] = {
        {MPV_RENDER_PARAM_API_TYPE, const_cast<char*>(MPV_RENDER_API_TYPE_OPENGL)},
        {MPV_RENDER_PARAM_OPENGL_INIT_PARAMS, &init},
        {MPV_RENDER_PARAM_INVALID, nullptr},
    };
    const std::shared_ptr<MpvCore>& core = player->mpvCore();
    attachment_ = core->attachRenderer(
        params, {[this] { onUpdate(); }, [this] { makeCurrent(); }, [this] { doneCurrent(); }});
    doneCurrent();
    if (attachment_ == 0) {
        if (onFailed)
            onFailed();
        return;
    }
    core_ = core;
}

void OpenGLVideoSurface::detach() {
    if (auto core = core_.lock()) {
        // The core makes this widget's context current around the release.
        core->detachRenderer(attachment_);
    }
    core_.reset();
    attachment_ = 0;
}

void OpenGLVideoSurface::onUpdate() {
    const std::shared_ptr<MpvCore> core = core_.lock();
    mpv_render_context* context = core ? core->renderContext(attachment_) : nullptr;
    if (!context)
        return;
    makeCurrent();
    const bool newFrame = mpv_render_context_update(context) & MPV_RENDER_UPDATE_FRAME;
    if (newFrame && !isVisible()) {
        // Nobody will paint: take the frame so playback goes on.
        int skip = 1;
        int noWait = 0;
        mpv_render_param params[] = {{MPV_RENDER_PARAM_SKIP_RENDERING, &skip},
                                     {MPV_RENDER_PARAM_BLOCK_FOR_TARGET_TIME, &noWait},
                                     {MPV_RENDER_PARAM_INVALID, nullptr}};
        mpv_render_context_render(context, params);
    }
    doneCurrent();
    if (newFrame) {
        frameSeen_ = true;
        QOpenGLWidget::update();
    }
}

void OpenGLVideoSurface::paintGL() {
    const std::shared_ptr<MpvCore> core = core_.lock();
    mpv_render_context* context = core ? core->renderContext(attachment_) : nullptr;
    if (!context)
        return;
    const qreal ratio = devicePixelRatioF();
    mpv_opengl_fbo fbo{static_cast<int>(defaultFramebufferObject()), int(width() * ratio),
                       int(height() * ratio), 0};
    int flip = 1;
    int noWait = 0;
    mpv_render_param params[] = {
        {MPV_RENDER_PARAM_OPENGL_FBO, &fbo},
        {MPV_RENDER_PARAM_FLIP_Y, &flip},
        {MPV_RENDER_PARAM_BLOCK_FOR_TARGET_TIME, &noWait},
        {MPV_RENDER_PARAM_INVALID, nullptr},
    };
    mpv_render_context_render(context, params);
    hasFrame_ = frameSeen_;
}

} // namespace platform

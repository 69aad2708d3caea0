#include "VideoSurface.h"

#include "OpenGLVideoSurface.h"
#include "SoftwareVideoSurface.h"

#include <QGuiApplication>
#include <QOffscreenSurface>
#include <QOpenGLContext>
#include <QOpenGLFunctions>

namespace platform {

namespace {

// A GL context that can be made current, on real graphics hardware: a GL
// rasteriser running on the CPU draws video slower than libmpv's own
// software renderer does.
bool openGLWorks() {
    const QString platformName = QGuiApplication::platformName();
    if (platformName == QStringLiteral("offscreen") || platformName == QStringLiteral("minimal"))
        return false;
    QOpenGLContext context;
    if (!context.create())
        return false;
    QOffscreenSurface surface;
    surface.setFormat(context.format());
    surface.create();
    if (!surface.isValid() || !context.makeCurrent(&surface))
        return false;
    const auto* renderer = context.functions()->glGetString(GL_RENDERER);
    const QByteArray name =
        renderer ? QByteArray(reinterpret_cast<const char*>(renderer)).toLower() : QByteArray();
    context.doneCurrent();
    for (const char* software : {"llvmpipe", "softpipe", "swrast", "software rasterizer"}) {
        if (name.contains(software))
            return false;
    }
    return !name.isEmpty();
}

} // namespace

VideoSurface::Kind VideoSurface::preferredKind() {
    const QString forced = qEnvironmentVariable("TAMSEL_VIDEO_RENDERER");
    if (forced == QStringLiteral("software"))
        return Kind::Software;
    if (forced == QStringLiteral("opengl"))
        return Kind::OpenGL;
    if (!qGuiApp)
        return Kind::Software;
    static const Kind probed = openGLWorks() ? Kind::OpenGL : Kind::Software;
    return probed;
}

std::unique_ptr<VideoSurface> VideoSurface::create(Kind kind, QWidget* parent) {
    if (kind == Kind::OpenGL)
        return std::make_unique<OpenGLVideoSurface>(parent);
    return std::make_unique<SoftwareVideoSurface>(parent);
}

} // namespace platform

#include "platform/ui/Device.h"

#include "platform/runtime/Log.h"

#include <QGuiApplication>
#include <QOffscreenSurface>
#include <QOpenGLContext>
#include <QOpenGLFunctions>
#include <QStringList>
#include <mutex>

namespace platform {

namespace {

std::optional<Device::InterfaceIdiom> idiomOverride;
std::optional<int> qualityOverride;

bool softwareRendererName(const QString& renderer) {
    const QString lower = renderer.toLower();
    return lower.contains(QLatin1String("llvmpipe")) || lower.contains(QLatin1String("softpipe")) ||
           lower.contains(QLatin1String("swiftshader")) ||
           lower.contains(QLatin1String("software"));
}

int probeGraphicsQuality() {
    const QString platformName = QGuiApplication::platformName();
    if (platformName == QLatin1String("offscreen") || platformName == QLatin1String("minimal") ||
        platformName.isEmpty())
        return Device::SoftwareGraphicsQuality;
    if (qEnvironmentVariableIntValue("LIBGL_ALWAYS_SOFTWARE") != 0)
        return Device::SoftwareGraphicsQuality;

    QOpenGLContext context;
    if (!context.create())
        return Device::SoftwareGraphicsQuality;
    QOffscreenSurface surface;
    surface.setFormat(context.format());
    surface.create();
    if (!surface.isValid() || !context.makeCurrent(&surface))
        return Device::SoftwareGraphicsQuality;
    const auto* renderer =
        reinterpret_cast<const char*>(context.functions()->glGetString(GL_RENDERER));
    const QString name = renderer ? QString::fromLatin1(renderer) : QString();
    context.doneCurrent();
    if (name.isEmpty() || softwareRendererName(name))
        return Device::SoftwareGraphicsQuality;
    return Device::HardwareGraphicsQuality;
}

} // namespace

Device::InterfaceIdiom Device::userInterfaceIdiom() {
    if (idiomOverride)
        return *idiomOverride;
    if (auto fromEnvironment = idiomFromName(qEnvironmentVariable("TAMSEL_DEVICE")))
        return *fromEnvironment;
    return InterfaceIdiom::Unspecified;
}

void Device::setInterfaceIdiomOverride(std::optional<InterfaceIdiom> idiom) {
    idiomOverride = idiom;
}

std::optional<Device::InterfaceIdiom> Device::idiomFromName(const QString& name) {
    const QString lower = name.trimmed().toLower();
    if (lower == QLatin1String("phone"))
        return InterfaceIdiom::Phone;
    if (lower == QLatin1String("tablet") || lower == QLatin1String("pad"))
        return InterfaceIdiom::Pad;
    return std::nullopt;
}

bool Device::applyDeviceArgument(QStringList& arguments) {
    for (int i = 0; i < arguments.size(); ++i) {
        QString value;
        int taken = 0;
        if (arguments[i] == QLatin1String("--device") && i + 1 < arguments.size()) {
            value = arguments[i + 1];
            taken = 2;
        } else if (arguments[i].startsWith(QLatin1String("--device="))) {
            value = arguments[i].mid(9);
            taken = 1;
        } else {
            continue;
        }
        arguments.remove(i, taken);
        if (auto idiom = idiomFromName(value)) {
            setInterfaceIdiomOverride(idiom);
            return true;
        }
        logError(QStringLiteral("Unknown device \"%1\"; expected phone or tablet").arg(value));
        return false;
    }
    return false;
}

int Device::graphicsQuality() {
    if (qualityOverride)
        return *qualityOverride;
    bool ok = false;
    const int fromEnvironment = qEnvironmentVariableIntValue("TAMSEL_GRAPHICS_QUALITY", &ok);
    if (ok)
        return fromEnvironment;
    static std::once_flag once;
    static int probed = SoftwareGraphicsQuality;
    std::call_once(once, [] { probed = probeGraphicsQuality(); });
    return probed;
}

void Device::setGraphicsQualityOverride(std::optional<int> quality) {
    qualityOverride = quality;
}

bool Device::deviceSupportsCapability(const QString& key) {
    static const QStringList known{VideoPublishingCapability};
    if (!known.contains(key))
        return false;
    const QStringList disabled =
        qEnvironmentVariable("TAMSEL_DISABLED_CAPABILITIES").split(u',', Qt::SkipEmptyParts);
    for (const QString& entry : disabled)
        if (entry.trimmed() == key)
            return false;
    return true;
}

} // namespace platform

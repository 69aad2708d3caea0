#pragma once

#include <QString>
#include <optional>

namespace platform {

// Device services. Main thread only.
//
// A desktop has no interface idiom of its own; the layout follows the
// window's shape. A phone or tablet idiom can be forced for testing, with
// `--device phone|tablet` on the command line (see applyDeviceArgument), the
// TAMSEL_DEVICE environment variable, or setInterfaceIdiomOverride.
class Device {
  public:
    enum class InterfaceIdiom { Unspecified = -1, Phone = 0, Pad = 1 };

    // The value the device reports when rendering is software-only.
    static constexpr int SoftwareGraphicsQuality = 10;
    // What a machine with hardware rendering reports.
    static constexpr int HardwareGraphicsQuality = 100;

    static InterfaceIdiom userInterfaceIdiom();
    static void setInterfaceIdiomOverride(std::optional<InterfaceIdiom> idiom);
    // "phone", "tablet" (or "pad"); anything else is nullopt.
    static std::optional<InterfaceIdiom> idiomFromName(const QString& name);
    // Takes "--device NAME" or "--device=NAME" out of the arguments and sets
    // the override; returns whether one was found and understood. A bad name
    // is logged and ignored.
    static bool applyDeviceArgument(QStringList& arguments);

    // The graphics-quality class: SoftwareGraphicsQuality when rendering is
    // software-only (no OpenGL, a software rasteriser such as llvmpipe, the
    // offscreen or minimal platforms, LIBGL_ALWAYS_SOFTWARE), else
    // HardwareGraphicsQuality. Probed once; TAMSEL_GRAPHICS_QUALITY or the
    // override replaces the probe.
    static int graphicsQuality();
    static void setGraphicsQualityOverride(std::optional<int> quality);

    // Whether the device offers a capability by its key (VideoPublishingCapability,
    // say). A desktop offers every capability it knows, except those named in
    // TAMSEL_DISABLED_CAPABILITIES (comma-separated keys), which is how a
    // machine, or a test, turns one off. Unknown keys are not offered.
    static bool deviceSupportsCapability(const QString& key);
    static inline const QString VideoPublishingCapability = QStringLiteral("video-publishing");
};

} // namespace platform

#pragma once

#include <QImage>
#include <QString>

namespace platform {

class Bundle;

// Images by name from a bundle: "<name>@3x.png", "<name>@2x.png" or
// "<name>.png" at the bundle's top, the one closest to `scale` first (a
// larger one before a smaller one). The image's device pixel ratio is the
// variant's scale, so its size in points is the same whichever variant was
// found. A null image when the bundle has no variant, or when none can be
// read (nothing is logged). Any thread.
namespace NamedImage {

QImage imageNamed(const QString& name, const Bundle* bundle, qreal scale);

} // namespace NamedImage
} // namespace platform

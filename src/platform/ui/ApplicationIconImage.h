#pragma once

#include <QImage>

namespace platform {

// An image drawn as an application icon: centred on a white tile with the
// rounded corners the desktop gives application icons, at a fixed size per
// format. Any thread (it only draws off screen).
namespace ApplicationIconImage {

enum class Format {
    Small = 0,  // 29 points: settings lists
    Medium = 1, // 40 points: search results
    Large = 2,  // 60 points: launchers
};

// Side of the tile in points.
qreal sideOf(Format format);

// `image` scaled to fit within the tile's inner area (its aspect kept) and
// drawn on the tile, at `scale` pixels per point (the result's device pixel
// ratio). `precomposed` asks for an icon whose shine is already drawn; the
// desktop draws none, so it changes nothing. A null image gives the bare
// tile; a scale of 0 or less is taken as 1.
QImage applicationIconImageForFormat_precomposed_scale(const QImage& image, Format format,
                                                       bool precomposed, qreal scale);

} // namespace ApplicationIconImage
} // namespace platform

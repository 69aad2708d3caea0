#pragma once

#include <QImage>

namespace platform {

// A soft blur of `image` with roughly the given radius in pixels: the image
// is shrunk, box-blurred three times (close to a Gaussian) and grown back.
// Returns an image of the same size and format ARGB32_Premultiplied. Any
// thread.
QImage blurredImage(const QImage& image, qreal radius);

} // namespace platform

#pragma once

#include <QImage>
#include <QPainter>
#include <QSizeF>
#include <memory>

namespace platform {

// Blend modes of off-screen drawing, numbered as the toolkit numbers them.
enum class BlendMode {
    Normal = 0,          // source over
    DestinationOut = 23, // keeps the destination times (1 - source alpha)
};

// An off-screen bitmap drawing context. Sizes and positions are in points;
// the bitmap has size × scale pixels and the image taken from it carries that
// scale as its device pixel ratio. A context that is not opaque starts fully
// transparent, an opaque one black. A zero size gives a null image. Any
// thread, one context per thread at a time.
class ImageContext {
  public:
    // `scale` <= 0 means the main screen's scale.
    ImageContext(const QSizeF& size, bool opaque, qreal scale);
    ~ImageContext();
    ImageContext(const ImageContext&) = delete;
    ImageContext& operator=(const ImageContext&) = delete;

    // Fills `rect` with the grey level `white` (0 black, 1 white) at `alpha`,
    // in source-over mode.
    void fillRect(const QRectF& rect, qreal white, qreal alpha);
    // Draws `image` unscaled (at its own size in points) with its top left at
    // `point`.
    void drawImage(const QImage& image, const QPointF& point, BlendMode mode, qreal alpha);

    // The picture so far. Drawing can go on afterwards.
    QImage image();
    QSizeF size() const { return size_; }
    qreal scale() const { return scale_; }

    static QPainter::CompositionMode compositionMode(BlendMode mode);

  private:
    QSizeF size_;
    qreal scale_;
    QImage bitmap_;
    std::unique_ptr<QPainter> painter_;
};

} // namespace platform

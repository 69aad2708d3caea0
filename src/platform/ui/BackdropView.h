#pragma once

#include "platform/ui/View.h"

#include <QList>
#include <QPointer>

namespace platform {

// A view that shows a blurred, lightened copy of what lies beneath it in its
// window (the views stacked under it and under its ancestors), clipped by its
// mask views. Main thread only.
//
// Mask views may sit anywhere in the same window; each one's shape, taken
// where it is on screen, adds to the area the backdrop shows. Without mask
// views the whole bounds show. Mask flags combine:
//   MaskShape (1)      the view takes part in the mask
//   MaskIgnoresAlpha (2) its shape is taken at full opacity, whatever its alpha
//   MaskInverted (4)   the backdrop shows where the view is transparent
// An image view or a Button gives the shape of its image; any other view its
// bounds.
class BackdropView : public View {
    Q_OBJECT
  public:
    enum MaskFlag { MaskShape = 1, MaskIgnoresAlpha = 2, MaskInverted = 4 };

    // `style` picks the look; every style blurs and lightens. The style
    // numbers of the toolkit's blurred backdrops (e.g. 2010) are accepted.
    explicit BackdropView(const QRectF& frame = QRectF(), int style = 2010,
                          QWidget* parent = nullptr);

    int style() const { return style_; }
    qreal blurRadius() const { return blurRadius_; }
    void setBlurRadius(qreal radius);

    void addMaskView(QWidget* view, int flags);
    void removeMaskView(QWidget* view);
    int maskFlags(const QWidget* view) const;

    // The mask as it stands, at `scale` pixels per point: alpha 255 where the
    // backdrop shows. Null when there are no mask views.
    QImage maskImage(qreal scale) const;

  protected:
    void paintEvent(QPaintEvent* event) override;

  private:
    struct Mask {
        QPointer<QWidget> view;
        int flags;
    };
    void renderBeneath(QPainter& painter);
    void watchMaskView(QWidget* view);
    bool eventFilter(QObject* watched, QEvent* event) override;

    int style_;
    qreal blurRadius_ = 20.0;
    QList<Mask> masks_;
};

} // namespace platform

#include "platform/ui/BackdropView.h"

#include "platform/ui/Button.h"
#include "platform/ui/ImageBlur.h"
#include "platform/ui/ImageView.h"
#include "platform/ui/ViewAlpha.h"

#include <QEvent>
#include <QPainter>

namespace platform {

namespace {

// Nonzero while a backdrop renders what lies beneath it: a backdrop met
// during that capture shows nothing, which ends the recursion.
int capturing = 0;

QImage shapeOf(QWidget* view, const QSize& pixels) {
    QImage shape(pixels, QImage::Format_ARGB32_Premultiplied);
    shape.fill(Qt::transparent);
    QPainter painter(&shape);
    painter.setRenderHint(QPainter::SmoothPixmapTransform);
    const QRectF area(QPointF(0, 0), QSizeF(pixels));
    QImage image;
    if (auto* imageView = qobject_cast<ImageView*>(view))
        image = imageView->image();
    else if (auto* button = qobject_cast<Button*>(view))
        image = button->currentImage();
    else
        painter.fillRect(area, Qt::white);
    if (!image.isNull())
        painter.drawImage(area, image);
    return shape;
}

} // namespace

BackdropView::BackdropView(const QRectF& frame, int style, QWidget* parent)
    : View(frame, parent), style_(style) {}

void BackdropView::setBlurRadius(qreal radius) {
    blurRadius_ = std::max<qreal>(0.0, radius);
    update();
}

void BackdropView::addMaskView(QWidget* view, int flags) {
    if (!view)
        return;
    for (Mask& mask : masks_) {
        if (mask.view == view) {
            mask.flags = flags;
            update();
            return;
        }
    }
    masks_.append({view, flags});
    watchMaskView(view);
    update();
}

void BackdropView::removeMaskView(QWidget* view) {
    masks_.removeIf([view](const Mask& mask) { return mask.view == view; });
    if (view)
        view->removeEventFilter(this);
    update();
}

int BackdropView::maskFlags(const QWidget* view) const {
    for (const Mask& mask : masks_)
        if (mask.view == view)
            return mask.flags;
    return 0;
}

void BackdropView::watchMaskView(QWidget* view) {
    view->installEventFilter(this);
}

bool BackdropView::eventFilter(QObject* watched, QEvent* event) {
    // Moves and size changes of a mask change the shape; paints do not (and
    // watching them would make the two repaint each other for ever).
    switch (event->type()) {
    case QEvent::Move:
    case QEvent::Resize:
    case QEvent::Show:
    case QEvent::Hide:
        update();
        break;
    default:
        break;
    }
    return View::eventFilter(watched, event);
}

QImage BackdropView::maskImage(qreal scale) const {
    bool any = false;
    for (const Mask& mask : masks_)
        any = any || (mask.view && (mask.flags & MaskShape));
    if (!any)
        return {};
    const QSize pixels = (QSizeF(size()) * scale).toSize();
    QImage result(pixels, QImage::Format_ARGB32_Premultiplied);
    result.fill(Qt::transparent);
    QPainter painter(&result);
    for (const Mask& mask : masks_) {
        QWidget* view = mask.view;
        if (!view || !(mask.flags & MaskShape) || view->window() != window())
            continue;
        const QSize viewPixels = (QSizeF(view->size()) * scale).toSize();
        if (viewPixels.isEmpty())
            continue;
        QImage shape = shapeOf(view, viewPixels);
        if (mask.flags & MaskInverted) {
            QImage inverted(viewPixels, QImage::Format_ARGB32_Premultiplied);
            inverted.fill(Qt::white);
            QPainter invert(&inverted);
            invert.setCompositionMode(QPainter::CompositionMode_DestinationOut);
            invert.drawImage(0, 0, shape);
            invert.end();
            shape = inverted;
        }
        const QPoint origin = mapFromGlobal(view->mapToGlobal(QPoint(0, 0)));
        painter.setOpacity((mask.flags & MaskIgnoresAlpha) ? 1.0
                                                           : ViewAlpha::presentationAlpha(view));
        painter.drawImage(QPointF(origin) * scale, shape);
    }
    return result;
}

void BackdropView::renderBeneath(QPainter& painter) {
    QList<QWidget*> chain;
    for (QWidget* w = this; w; w = w->isWindow() ? nullptr : w->parentWidget())
        chain.prepend(w);
    const QRect selfRect = rect();
    for (int level = 0; level + 1 < chain.size(); ++level) {
        QWidget* ancestor = chain[level];
        QWidget* next = chain[level + 1];
        const QPoint selfInAncestor = mapTo(ancestor, QPoint(0, 0));
        const QRect wanted = selfRect.translated(selfInAncestor);
        // render() puts the top left of the region it draws at the offset
        // it is given, so the offset is where that corner lies in our
        // coordinates.
        const QRect own = wanted.intersected(ancestor->rect());
        if (!own.isEmpty())
            ancestor->render(&painter, own.topLeft() - selfInAncestor, QRegion(own),
                             ancestor->isWindow() ? QWidget::DrawWindowBackground
                                                  : QWidget::RenderFlags());
        for (QObject* object : ancestor->children()) {
            if (object == next)
                break;
            auto* sibling = qobject_cast<QWidget*>(object);
            if (!sibling || sibling->isWindow() || !sibling->isVisible())
                continue;
            const QRect region = wanted.translated(-sibling->pos()).intersected(sibling->rect());
            if (region.isEmpty())
                continue;
            sibling->render(&painter, sibling->pos() + region.topLeft() - selfInAncestor,
                            QRegion(region), QWidget::DrawChildren);
        }
    }
}

void BackdropView::paintEvent(QPaintEvent* event) {
    View::paintEvent(event);
    if (capturing || size().isEmpty())
        return;
    const qreal scale = devicePixelRatioF();
    QImage beneath((QSizeF(size()) * scale).toSize(), QImage::Format_ARGB32_Premultiplied);
    beneath.setDevicePixelRatio(scale);
    beneath.fill(Qt::transparent);
    {
        QPainter capture(&beneath);
        ++capturing;
        renderBeneath(capture);
        --capturing;
    }
    QImage blurred = blurredImage(beneath, blurRadius_ * scale);
    blurred.setDevicePixelRatio(1.0);
    {
        QPainter finish(&blurred);
        // A frosted look: the blur is lightened so that dark glyphs and text
        // on top stay legible.
        finish.fillRect(blurred.rect(), QColor(255, 255, 255, style_ == 2010 ? 110 : 80));
        const QImage mask = maskImage(scale);
        if (!mask.isNull()) {
            finish.setCompositionMode(QPainter::CompositionMode_DestinationIn);
            finish.drawImage(0, 0, mask);
        }
    }
    blurred.setDevicePixelRatio(scale);
    QPainter painter(this);
    painter.drawImage(QPointF(0, 0), blurred);
}

} // namespace platform

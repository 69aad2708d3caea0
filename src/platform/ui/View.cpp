#include "platform/ui/View.h"

#include "platform/ui/ViewAlpha.h"
#include "platform/ui/ViewHandle.h"

#include <QChildEvent>
#include <QCoreApplication>
#include <QPainter>
#include <QResizeEvent>
#include <QVariant>
#include <cmath>

namespace platform {

namespace {

constexpr const char* kFrame = "tamsel.frame";
constexpr const char* kAutoresizing = "tamsel.autoresizing";
constexpr const char* kNoTranslation = "tamsel.noAutoresizingTranslation";
constexpr const char* kHidden = "tamsel.hidden";

QRect pixelRect(const QRectF& frame) {
    const int left = int(std::lround(frame.left()));
    const int top = int(std::lround(frame.top()));
    const int right = int(std::lround(frame.left() + frame.width()));
    const int bottom = int(std::lround(frame.top() + frame.height()));
    return QRect(left, top, std::max(0, right - left), std::max(0, bottom - top));
}

} // namespace

View::View(const QRectF& frame, QWidget* parent) : QWidget(parent) {
    setFrame(frame);
    lastSize_ = frame.size();
}

View::~View() = default;

QRectF View::frameOf(const QWidget* widget) {
    if (!widget)
        return {};
    const QVariant stored = widget->property(kFrame);
    if (stored.isValid()) {
        const QRectF frame = stored.toRectF();
        const QRect expected = pixelRect(frame);
        const auto* view = qobject_cast<const View*>(widget);
        const bool grows = view && !view->clipsToBounds();
        // Somebody may have moved the widget with plain Qt calls since.
        if (widget->pos() == expected.topLeft() &&
            (widget->size() == expected.size() || (grows && widget->width() >= expected.width() &&
                                                   widget->height() >= expected.height())))
            return frame;
    }
    return QRectF(widget->geometry());
}

void View::setFrameOf(QWidget* widget, const QRectF& frame) {
    if (!widget)
        return;
    widget->setProperty(kFrame, frame);
    QRect geometry = pixelRect(frame);
    if (auto* view = qobject_cast<View*>(widget); view && !view->clipsToBounds()) {
        const QRect children = view->childrenRect();
        geometry.setWidth(std::max(geometry.width(), children.right() + 1));
        geometry.setHeight(std::max(geometry.height(), children.bottom() + 1));
    }
    widget->setGeometry(geometry);
    if (auto* view = qobject_cast<View*>(widget))
        view->sizeMayHaveChanged();
    // Views placed relative to this one move with it; hidden widgets get no
    // move events to tell them.
    for (QWidget* ancestor = widget->parentWidget(); ancestor;
         ancestor = ancestor->parentWidget()) {
        auto* holder = qobject_cast<View*>(ancestor);
        if (!holder)
            continue;
        for (const LayoutConstraint& c : std::as_const(holder->constraints_))
            if (c.secondItem == widget) {
                holder->setNeedsLayout();
                break;
            }
    }
}

QRectF View::boundsOf(const QWidget* widget) {
    return QRectF(QPointF(0, 0), frameOf(widget).size());
}

void View::removeFromSuperview(QWidget* widget) {
    if (!widget || !widget->parentWidget())
        return;
    QList<View*> ancestors;
    for (QWidget* ancestor = widget->parentWidget(); ancestor; ancestor = ancestor->parentWidget())
        if (auto* view = qobject_cast<View*>(ancestor))
            ancestors.append(view);
    const QRectF frame = frameOf(widget);
    widget->setParent(nullptr);
    widget->setProperty(kFrame, frame);
    for (View* ancestor : ancestors)
        ancestor->dropConstraintsOutsideSubtree();
    if (ViewHandles::count(widget) == 0)
        widget->deleteLater();
}

View::AutoresizingMask View::autoresizingMaskOf(const QWidget* widget) {
    return widget ? AutoresizingMask(widget->property(kAutoresizing).toInt()) : AutoresizingMask();
}

void View::setAutoresizingMaskOf(QWidget* widget, AutoresizingMask mask) {
    if (widget)
        widget->setProperty(kAutoresizing, int(mask));
}

bool View::translatesOf(const QWidget* widget) {
    return widget && !widget->property(kNoTranslation).toBool();
}

void View::setTranslatesOf(QWidget* widget, bool translates) {
    if (widget)
        widget->setProperty(kNoTranslation, !translates);
}

bool View::isHiddenOf(const QWidget* widget) {
    return widget && widget->property(kHidden).toBool();
}

void View::setHiddenOf(QWidget* widget, bool hidden) {
    if (!widget)
        return;
    widget->setProperty(kHidden, hidden);
    // A detached view must not turn into a window of its own.
    if (hidden)
        widget->hide();
    else if (widget->parentWidget())
        widget->show();
}

void View::setCenter(const QPointF& center) {
    QRectF f = frame();
    f.moveCenter(center);
    setFrame(f);
}

qreal View::alpha() const {
    return ViewAlpha::alpha(this);
}

void View::setAlpha(qreal alpha) {
    ViewAlpha::setAlpha(this, alpha);
}

void View::setBackgroundColor(const QColor& colour) {
    backgroundColor_ = colour;
    update();
}

void View::setClipsToBounds(bool clips) {
    clipsToBounds_ = clips;
    updateOverflow();
}

void View::setUserInteractionEnabled(bool enabled) {
    setProperty("tamsel.interactionDisabled", !enabled);
    // An invisible view lets presses through whatever this says.
    const bool invisible = ViewAlpha::presentationAlpha(this) < 0.01;
    setAttribute(Qt::WA_TransparentForMouseEvents, !enabled || invisible);
}

void View::addSubview(QWidget* view) {
    if (!view || view == this)
        return;
    if (view->parentWidget() != this)
        view->setParent(this);
    view->raise();
    if (!isHiddenOf(view))
        view->show();
    updateOverflow();
}

void View::insertSubviewBelow(QWidget* view, QWidget* sibling) {
    addSubview(view);
    if (view && sibling && sibling->parentWidget() == this)
        view->stackUnder(sibling);
}

void View::insertSubviewAbove(QWidget* view, QWidget* sibling) {
    addSubview(view);
    if (view && sibling && sibling->parentWidget() == this) {
        // Qt only stacks under: put the sibling under the view instead.
        sibling->stackUnder(view);
    }
}

void View::addConstraint(const LayoutConstraint& constraint) {
    addConstraints({constraint});
}

void View::addConstraints(const QList<LayoutConstraint>& constraints) {
    for (const LayoutConstraint& constraint : constraints) {
        constraints_.append(constraint);
        // A move of the other item moves the constrained one with it.
        if (QWidget* second = constraint.secondItem; second && second != this)
            second->installEventFilter(this);
    }
    setNeedsLayout();
}

void View::removeConstraints(const QList<LayoutConstraint>& constraints) {
    constraints_.removeIf([&](const LayoutConstraint& c) {
        for (const LayoutConstraint& gone : constraints)
            if (c.firstItem == gone.firstItem && c.firstAttribute == gone.firstAttribute &&
                c.secondItem == gone.secondItem && c.secondAttribute == gone.secondAttribute &&
                c.multiplier == gone.multiplier && c.constant == gone.constant)
                return true;
        return false;
    });
    setNeedsLayout();
}

void View::dropConstraintsOutsideSubtree() {
    const auto outside = [this](const QPointer<QWidget>& item) {
        return item.isNull() || (item != this && !isAncestorOf(item));
    };
    constraints_.removeIf([&](const LayoutConstraint& c) {
        return outside(c.firstItem) ||
               (c.secondAttribute != LayoutAttribute::NotAnAttribute && outside(c.secondItem));
    });
}

void View::setNeedsLayout() {
    if (layoutPending_)
        return;
    layoutPending_ = true;
    QCoreApplication::postEvent(this, new QEvent(QEvent::LayoutRequest));
}

void View::layoutIfNeeded() {
    if (!layoutPending_ || inLayout_)
        return;
    layoutPending_ = false;
    emit willLayoutSubviews();
    inLayout_ = true;
    layoutSubviews();
    inLayout_ = false;
    emit didLayoutSubviews();
}

void View::layoutSubviews() {
    dropConstraintsOutsideSubtree();
    solveConstraints(this, constraints_);
}

QSizeF View::sizeThatFits(const QSizeF&) const {
    return frame().size();
}

void View::sizeToFit() {
    QRectF f = frame();
    f.setSize(sizeThatFits(f.size()));
    setFrame(f);
}

bool View::endEditing(bool) {
    QWidget* editing = window()->focusWidget();
    if (editing && (editing == this || isAncestorOf(editing)))
        editing->clearFocus();
    return true;
}

bool View::event(QEvent* event) {
    if (event->type() == QEvent::LayoutRequest) {
        layoutIfNeeded();
        return true;
    }
    return QWidget::event(event);
}

bool View::eventFilter(QObject* watched, QEvent* event) {
    if ((event->type() == QEvent::Move || event->type() == QEvent::Resize) && !inLayout_) {
        for (const LayoutConstraint& c : std::as_const(constraints_))
            if (c.secondItem == watched) {
                setNeedsLayout();
                break;
            }
    }
    return QWidget::eventFilter(watched, event);
}

void View::paintEvent(QPaintEvent*) {
    if (!backgroundColor_.isValid() || backgroundColor_.alpha() == 0)
        return;
    QPainter painter(this);
    painter.fillRect(bounds(), backgroundColor_);
}

void View::resizeEvent(QResizeEvent* event) {
    sizeMayHaveChanged();
    QWidget::resizeEvent(event);
}

void View::sizeMayHaveChanged() {
    const QSizeF newSize = frame().size();
    if (lastSize_ == newSize)
        return;
    if (lastSize_.isValid())
        autoresizeSubviews(lastSize_, newSize);
    lastSize_ = newSize;
    setNeedsLayout();
}

void View::childEvent(QChildEvent* event) {
    if (event->removed())
        dropConstraintsOutsideSubtree();
    QWidget::childEvent(event);
}

void View::autoresizeSubviews(const QSizeF& oldSize, const QSizeF& newSize) {
    // Each axis: the change is shared among the flexible parts (margin
    // before, size, margin after) in proportion to their present lengths.
    const auto share = [](double before, double length, double after, bool flexBefore,
                          bool flexLength, bool flexAfter, double delta, double& outBefore,
                          double& outLength) {
        outBefore = before;
        outLength = length;
        const int flexible = int(flexBefore) + int(flexLength) + int(flexAfter);
        if (flexible == 0)
            return;
        const double total =
            (flexBefore ? before : 0) + (flexLength ? length : 0) + (flexAfter ? after : 0);
        const auto part = [&](bool flex, double value) {
            if (!flex)
                return 0.0;
            return total > 0 ? delta * value / total : delta / flexible;
        };
        outBefore = before + part(flexBefore, before);
        outLength = length + part(flexLength, length);
    };

    for (QObject* object : children()) {
        auto* child = qobject_cast<QWidget*>(object);
        if (!child || child->isWindow() || !translatesOf(child))
            continue;
        const AutoresizingMask mask = autoresizingMaskOf(child);
        if (!mask)
            continue;
        const QRectF f = frameOf(child);
        double x, width, y, height;
        share(f.x(), f.width(), oldSize.width() - f.x() - f.width(), mask & FlexibleLeftMargin,
              mask & FlexibleWidth, mask & FlexibleRightMargin, newSize.width() - oldSize.width(),
              x, width);
        share(f.y(), f.height(), oldSize.height() - f.y() - f.height(), mask & FlexibleTopMargin,
              mask & FlexibleHeight, mask & FlexibleBottomMargin,
              newSize.height() - oldSize.height(), y, height);
        setFrameOf(child, QRectF(x, y, std::max(0.0, width), std::max(0.0, height)));
    }
}

void View::updateOverflow() {
    // Reapplying the frame grows or shrinks the widget around its subviews.
    setFrameOf(this, frame());
}

} // namespace platform

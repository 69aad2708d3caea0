#include "platform/ui/LayoutConstraint.h"

#include "platform/ui/View.h"

#include <QHash>
#include <optional>

namespace platform {

LayoutConstraint LayoutConstraint::make(QWidget* first, LayoutAttribute firstAttribute,
                                        QWidget* second, LayoutAttribute secondAttribute,
                                        double multiplier, double constant) {
    return {first, firstAttribute, second, secondAttribute, multiplier, constant};
}

LayoutConstraint LayoutConstraint::constantSize(QWidget* item, LayoutAttribute attribute,
                                                double constant) {
    return {item, attribute, nullptr, LayoutAttribute::NotAnAttribute, 1.0, constant};
}

bool LayoutConstraint::refersTo(const QWidget* widget) const {
    return firstItem == widget || (secondItem && secondItem == widget);
}

namespace {

// The frame of `item` in the coordinates of `container`.
QRectF frameIn(QWidget* container, QWidget* item) {
    if (item == container)
        return View::boundsOf(container);
    QRectF frame = View::frameOf(item);
    if (QWidget* parent = item->parentWidget(); parent && parent != container)
        frame.translate(parent->mapTo(container, QPoint(0, 0)));
    return frame;
}

double attributeOf(const QRectF& r, LayoutAttribute attribute) {
    switch (attribute) {
    case LayoutAttribute::Leading:
        return r.left();
    case LayoutAttribute::Trailing:
        return r.left() + r.width();
    case LayoutAttribute::Top:
        return r.top();
    case LayoutAttribute::Bottom:
        return r.top() + r.height();
    case LayoutAttribute::Width:
        return r.width();
    case LayoutAttribute::Height:
        return r.height();
    case LayoutAttribute::CenterX:
        return r.center().x();
    case LayoutAttribute::CenterY:
        return r.center().y();
    case LayoutAttribute::NotAnAttribute:
        break;
    }
    return 0.0;
}

struct Axis {
    std::optional<double> start, end, size, center;
};

// Resolves one axis from what is pinned, keeping the present position and
// size where nothing pins them.
void resolve(const Axis& axis, double& position, double& length) {
    if (axis.start && axis.end) {
        position = *axis.start;
        length = *axis.end - *axis.start;
        return;
    }
    if (axis.size)
        length = *axis.size;
    if (axis.start)
        position = *axis.start;
    else if (axis.end)
        position = *axis.end - length;
    else if (axis.center)
        position = *axis.center - length / 2.0;
}

bool inside(QWidget* container, QWidget* item) {
    return item && (item == container || container->isAncestorOf(item));
}

} // namespace

void solveConstraints(QWidget* container, const QList<LayoutConstraint>& constraints) {
    QList<QWidget*> order;
    QHash<QWidget*, QList<const LayoutConstraint*>> byItem;
    for (const LayoutConstraint& constraint : constraints) {
        QWidget* item = constraint.firstItem;
        if (!inside(container, item) || item == container)
            continue;
        if (constraint.secondAttribute != LayoutAttribute::NotAnAttribute &&
            !inside(container, constraint.secondItem))
            continue;
        if (!byItem.contains(item))
            order.append(item);
        byItem[item].append(&constraint);
    }

    // Twice, so that an item placed relative to another item placed later in
    // the list still sees where that one ends up.
    for (int pass = 0; pass < 2; ++pass) {
        for (QWidget* item : order) {
            Axis horizontal, vertical;
            for (const LayoutConstraint* c : byItem.value(item)) {
                double value = c->constant;
                if (c->secondAttribute != LayoutAttribute::NotAnAttribute)
                    value += attributeOf(frameIn(container, c->secondItem), c->secondAttribute) *
                             c->multiplier;
                switch (c->firstAttribute) {
                case LayoutAttribute::Leading:
                    horizontal.start = value;
                    break;
                case LayoutAttribute::Trailing:
                    horizontal.end = value;
                    break;
                case LayoutAttribute::Width:
                    horizontal.size = value;
                    break;
                case LayoutAttribute::CenterX:
                    horizontal.center = value;
                    break;
                case LayoutAttribute::Top:
                    vertical.start = value;
                    break;
                case LayoutAttribute::Bottom:
                    vertical.end = value;
                    break;
                case LayoutAttribute::Height:
                    vertical.size = value;
                    break;
                case LayoutAttribute::CenterY:
                    vertical.center = value;
                    break;
                case LayoutAttribute::NotAnAttribute:
                    break;
                }
            }
            QRectF frame = frameIn(container, item);
            double x = frame.x(), width = frame.width(), y = frame.y(), height = frame.height();
            resolve(horizontal, x, width);
            resolve(vertical, y, height);
            QRectF placed(x, y, std::max(0.0, width), std::max(0.0, height));
            if (QWidget* parent = item->parentWidget(); parent && parent != container)
                placed.translate(-QPointF(parent->mapTo(container, QPoint(0, 0))));
            View::setFrameOf(item, placed);
        }
    }
}

} // namespace platform

#pragma once

#include <QList>
#include <QPointer>
#include <QRectF>
#include <QWidget>

namespace platform {

enum class LayoutAttribute {
    NotAnAttribute,
    Leading, // the left edge (the toolkit lays out left to right)
    Trailing,
    Top,
    Bottom,
    Width,
    Height,
    CenterX,
    CenterY,
};

// One equality: firstItem.firstAttribute = secondItem.secondAttribute *
// multiplier + constant, in points. With no second item (a size constraint)
// it is firstItem.firstAttribute = constant. Items are watched weakly: a
// constraint whose item has gone is dropped by the view that holds it.
struct LayoutConstraint {
    QPointer<QWidget> firstItem;
    LayoutAttribute firstAttribute = LayoutAttribute::NotAnAttribute;
    QPointer<QWidget> secondItem;
    LayoutAttribute secondAttribute = LayoutAttribute::NotAnAttribute;
    double multiplier = 1.0;
    double constant = 0.0;

    static LayoutConstraint make(QWidget* first, LayoutAttribute firstAttribute, QWidget* second,
                                 LayoutAttribute secondAttribute, double multiplier = 1.0,
                                 double constant = 0.0);
    // firstItem.attribute = constant (width or height).
    static LayoutConstraint constantSize(QWidget* item, LayoutAttribute attribute, double constant);

    bool refersTo(const QWidget* widget) const;
};

// Places the first items of `constraints`, held by `container`, in the
// container's coordinates. For each item and attribute the constraint added
// last wins, so a later constraint overrides an earlier one that conflicts
// with it. The other edges keep the item's present frame. Constraints whose
// items are gone, or not inside the container, are skipped.
void solveConstraints(QWidget* container, const QList<LayoutConstraint>& constraints);

} // namespace platform

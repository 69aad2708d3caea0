#pragma once

#include "platform/ui/LayoutConstraint.h"

#include <QColor>
#include <QList>
#include <QRectF>
#include <QWidget>

namespace platform {

// A plain rectangular view: a widget with a frame in points (its place in its
// superview), bounds (its own coordinate space, origin 0,0), an alpha, a
// background colour, an autoresizing mask and the layout constraints it holds.
// Main thread only.
//
// Ownership: a view's superview owns it (the Qt parent). removeFromSuperview
// detaches a view; a detached view lives on only while a ViewHandle holds it.
//
// The static helpers work on any widget, so toolkit buttons that are not Views
// have frames, alpha and autoresizing too.
class View : public QWidget {
    Q_OBJECT
  public:
    enum Autoresizing {
        FlexibleNone = 0,
        FlexibleLeftMargin = 1 << 0,
        FlexibleWidth = 1 << 1,
        FlexibleRightMargin = 1 << 2,
        FlexibleTopMargin = 1 << 3,
        FlexibleHeight = 1 << 4,
        FlexibleBottomMargin = 1 << 5,
    };
    Q_DECLARE_FLAGS(AutoresizingMask, Autoresizing)

    explicit View(const QRectF& frame = QRectF(), QWidget* parent = nullptr);
    ~View() override;

    QRectF frame() const { return frameOf(this); }
    void setFrame(const QRectF& frame) { setFrameOf(this, frame); }
    QRectF bounds() const { return boundsOf(this); }
    QPointF center() const { return frame().center(); }
    void setCenter(const QPointF& center);

    qreal alpha() const;
    void setAlpha(qreal alpha);

    // Invalid (the default) draws nothing behind the subviews.
    QColor backgroundColor() const { return backgroundColor_; }
    void setBackgroundColor(const QColor& colour);

    // When false, subviews that reach past the bounds still show there (the
    // widget grows right and down to hold them while frame() stays as set).
    bool clipsToBounds() const { return clipsToBounds_; }
    void setClipsToBounds(bool clips);

    bool isUserInteractionEnabled() const {
        return !property("tamsel.interactionDisabled").toBool();
    }
    void setUserInteractionEnabled(bool enabled);

    // Subviews. Adding puts the view on top of its new siblings and shows it;
    // adding a view that is already there brings it to the top.
    void addSubview(QWidget* view);
    void insertSubviewBelow(QWidget* view, QWidget* sibling);
    void insertSubviewAbove(QWidget* view, QWidget* sibling);
    QWidget* superview() const { return parentWidget(); }
    void removeFromSuperview() { removeFromSuperview(this); }

    AutoresizingMask autoresizingMask() const { return autoresizingMaskOf(this); }
    void setAutoresizingMask(AutoresizingMask mask) { setAutoresizingMaskOf(this, mask); }
    // When false the autoresizing mask is ignored and only constraints place
    // the view.
    bool translatesAutoresizingMaskIntoConstraints() const { return translatesOf(this); }
    void setTranslatesAutoresizingMaskIntoConstraints(bool translates) {
        setTranslatesOf(this, translates);
    }

    // Constraints between this view's subtree and itself. They accumulate as
    // added; a constraint goes away when one of its items leaves the subtree
    // or is destroyed. They are applied on the next layout pass.
    void addConstraint(const LayoutConstraint& constraint);
    void addConstraints(const QList<LayoutConstraint>& constraints);
    void removeConstraints(const QList<LayoutConstraint>& constraints);
    QList<LayoutConstraint> constraints() const { return constraints_; }

    // Layout passes: one is posted to the event loop; layoutIfNeeded runs a
    // pending one at once.
    void setNeedsLayout();
    void layoutIfNeeded();

    // The size that fits the content; plain views keep their size.
    virtual QSizeF sizeThatFits(const QSizeF& size) const;
    void sizeToFit();

    // Ends text editing in this view's subtree: the field being edited (the
    // window's focus widget, when it lies here) gives up the focus, which
    // commits its text. Qt's fields cannot refuse, so `force` changes
    // nothing. Returns whether no field here is being edited any more.
    bool endEditing(bool force);

    // Helpers for any widget.
    static QRectF frameOf(const QWidget* widget);
    static void setFrameOf(QWidget* widget, const QRectF& frame);
    static QRectF boundsOf(const QWidget* widget);
    static void removeFromSuperview(QWidget* widget);
    static AutoresizingMask autoresizingMaskOf(const QWidget* widget);
    static void setAutoresizingMaskOf(QWidget* widget, AutoresizingMask mask);
    static bool translatesOf(const QWidget* widget);
    // Hidden views stay hidden when added to a superview.
    static bool isHiddenOf(const QWidget* widget);
    static void setHiddenOf(QWidget* widget, bool hidden);
    static void setTranslatesOf(QWidget* widget, bool translates);

  signals:
    // Before each layout pass.
    void willLayoutSubviews();
    // After each layout pass (constraints applied, layoutSubviews run).
    void didLayoutSubviews();

  protected:
    // Places subviews; the default applies the constraints.
    virtual void layoutSubviews();

    bool event(QEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void childEvent(QChildEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    // Autoresizes the subviews and schedules a layout pass when the size
    // differs from the last one seen (hidden widgets get no resize events).
    void sizeMayHaveChanged();
    void autoresizeSubviews(const QSizeF& oldSize, const QSizeF& newSize);
    void dropConstraintsOutsideSubtree();
    void updateOverflow();

    QColor backgroundColor_;
    bool clipsToBounds_ = true;
    bool layoutPending_ = false;
    bool inLayout_ = false;
    QSizeF lastSize_;
    QList<LayoutConstraint> constraints_;
};

Q_DECLARE_OPERATORS_FOR_FLAGS(View::AutoresizingMask)

} // namespace platform

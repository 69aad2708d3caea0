#pragma once

#include "platform/ui/View.h"

#include <QFont>

namespace platform {

// A one-line text label. The text is drawn inside the bounds, elided at the
// end when it does not fit; the accessible name follows the text. Main thread
// only.
class Label : public View {
    Q_OBJECT
  public:
    explicit Label(const QRectF& frame = QRectF(), QWidget* parent = nullptr);

    QString text() const { return text_; }
    void setText(const QString& text);
    QColor textColor() const { return textColor_; }
    void setTextColor(const QColor& colour);
    QFont labelFont() const { return font(); }
    // The system font at `points` points.
    void setSystemFontOfSize(qreal points);
    Qt::Alignment textAlignment() const { return alignment_; }
    void setTextAlignment(Qt::Alignment alignment);

    QSizeF sizeThatFits(const QSizeF& size) const override;

  protected:
    void paintEvent(QPaintEvent* event) override;

  private:
    QString text_;
    QColor textColor_ = Qt::black;
    Qt::Alignment alignment_ = Qt::AlignLeft | Qt::AlignVCenter;
};

} // namespace platform

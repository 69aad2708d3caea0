#pragma once

#include "platform/ui/View.h"

#include <QImage>

namespace platform {

// Shows an image scaled to its bounds. A new image view takes the image's
// size in points (pixels over the image's device pixel ratio). Main thread
// only.
class ImageView : public View {
    Q_OBJECT
  public:
    explicit ImageView(const QImage& image = QImage(), QWidget* parent = nullptr);

    QImage image() const { return image_; }
    void setImage(const QImage& image);

    QSizeF sizeThatFits(const QSizeF& size) const override;

  protected:
    void paintEvent(QPaintEvent* event) override;

  private:
    QImage image_;
};

} // namespace platform

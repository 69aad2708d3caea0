#include "platform/ui/ImageBlur.h"

#include <algorithm>
#include <vector>

namespace platform {

namespace {

// One horizontal box pass over premultiplied ARGB rows, with edges clamped.
void boxRows(QImage& image, int radius) {
    const int width = image.width();
    std::vector<QRgb> row(static_cast<size_t>(width));
    for (int y = 0; y < image.height(); ++y) {
        auto* line = reinterpret_cast<QRgb*>(image.scanLine(y));
        std::copy(line, line + width, row.begin());
        int sum[4] = {0, 0, 0, 0};
        const auto add = [&](QRgb p, int sign) {
            sum[0] += sign * qAlpha(p);
            sum[1] += sign * qRed(p);
            sum[2] += sign * qGreen(p);
            sum[3] += sign * qBlue(p);
        };
        const auto at = [&](int x) { return row[size_t(std::clamp(x, 0, width - 1))]; };
        for (int x = -radius; x <= radius; ++x)
            add(at(x), 1);
        const int span = 2 * radius + 1;
        for (int x = 0; x < width; ++x) {
            line[x] = qRgba(sum[1] / span, sum[2] / span, sum[3] / span, sum[0] / span);
            add(at(x - radius), -1);
            add(at(x + radius + 1), 1);
        }
    }
}

QImage transposed(const QImage& image) {
    QImage out(image.height(), image.width(), QImage::Format_ARGB32_Premultiplied);
    for (int y = 0; y < image.height(); ++y) {
        const auto* line = reinterpret_cast<const QRgb*>(image.constScanLine(y));
        for (int x = 0; x < image.width(); ++x)
            reinterpret_cast<QRgb*>(out.scanLine(x))[y] = line[x];
    }
    return out;
}

} // namespace

QImage blurredImage(const QImage& source, qreal radius) {
    if (source.isNull())
        return source;
    const QSize size = source.size();
    // Shrinking first keeps the passes cheap; the blur hides the loss.
    const int shrink = std::clamp(int(radius / 4.0), 1, 8);
    QImage small =
        source.convertToFormat(QImage::Format_ARGB32_Premultiplied)
            .scaled(std::max(1, size.width() / shrink), std::max(1, size.height() / shrink),
                    Qt::IgnoreAspectRatio, Qt::SmoothTransformation);
    small.setDevicePixelRatio(1.0);
    const int boxRadius = std::max(1, int(radius / shrink / 2.0));
    for (int pass = 0; pass < 3; ++pass)
        boxRows(small, boxRadius);
    small = transposed(small);
    for (int pass = 0; pass < 3; ++pass)
        boxRows(small, boxRadius);
    small = transposed(small);
    QImage result = small.scaled(size, Qt::IgnoreAspectRatio, Qt::SmoothTransformation)
                        .convertToFormat(QImage::Format_ARGB32_Premultiplied);
    result.setDevicePixelRatio(source.devicePixelRatio());
    return result;
}

} // namespace platform

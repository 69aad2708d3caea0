#include "FramePainter.h"
#include "MediaGenerator.h"

namespace testmedia {
namespace {

// Mean of the middle half of a cell, away from the blocking at its edges.
template <typename Sample> double cellMean(const CodeCell& c, const Sample& sample) {
    const int mx = (c.x1 - c.x0) / 4, my = (c.y1 - c.y0) / 4;
    const int x0 = c.x0 + mx, x1 = std::max(x0 + 1, c.x1 - mx);
    const int y0 = c.y0 + my, y1 = std::max(y0 + 1, c.y1 - my);
    double sum = 0;
    for (int y = y0; y < y1; ++y)
        for (int x = x0; x < x1; ++x)
            sum += sample(x, y);
    return sum / ((x1 - x0) * (y1 - y0));
}

template <typename Sample> int readCode(int width, int height, const Sample& sample) {
    if (width < 16 || height < 16)
        return -1;
    int index = 0;
    for (int bit = 0; bit < kFrameCodeBits; ++bit) {
        const double mean = cellMean(codeCell(bit, width, height), sample);
        // The cells are written at 16 and 235; anything in between means this
        // is not a coded frame (or not the frame's top).
        if (mean > 75 && mean < 175)
            return -1;
        if (mean >= 175)
            index |= 1 << bit;
    }
    return index;
}

} // namespace

int readFrameIndex(const QImage& frame) {
    if (frame.isNull())
        return -1;
    const QImage rgb = frame.convertToFormat(QImage::Format_RGB32);
    return readCode(rgb.width(), rgb.height(), [&](int x, int y) {
        const QRgb p = rgb.pixel(x, y);
        // Full-range luma of the converted pixel.
        return 0.299 * qRed(p) + 0.587 * qGreen(p) + 0.114 * qBlue(p);
    });
}

int readFrameIndex(const unsigned char* luma, int width, int height, int stride) {
    if (!luma)
        return -1;
    return readCode(width, height, [&](int x, int y) { return double(luma[y * stride + x]); });
}

} // namespace testmedia

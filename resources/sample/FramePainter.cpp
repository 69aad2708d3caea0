#include "FramePainter.h"

#include <QImage>
#include <QLinearGradient>
#include <QPainter>
#include <QPainterPath>
#include <QRadialGradient>

#include <algorithm>
#include <cmath>
#include <cstring>

extern "C" {
#include <libavutil/frame.h>
#include <libswscale/swscale.h>
}

namespace testmedia {
namespace {

constexpr int kCodeColumns = 8;
constexpr std::uint8_t kBright = 235;
constexpr std::uint8_t kDark = 16;

} // namespace

CodeCell codeCell(int bit, int width, int height) {
    const int column = bit % kCodeColumns;
    const int row = bit / kCodeColumns;
    const int cellW = width / kCodeColumns;
    const int cellH = height / 8;
    return {column * cellW, row * cellH, (column + 1) * cellW, (row + 1) * cellH};
}

FramePainter::FramePainter(const MovieSpec& movieSpec) : spec_(movieSpec) {
    // A soft colour wave, looked up instead of computed per pixel so that a
    // 1080p60 movie paints in a millisecond or two a frame.
    chromaWave_.resize(512);
    for (int i = 0; i < 512; ++i)
        chromaWave_[i] = static_cast<std::uint8_t>(128 + 40 * std::sin(i * 2 * M_PI / 512));
}

FramePainter::~FramePainter() {
    sws_freeContext(sws_);
}

bool FramePainter::paint(AVFrame* frame, int index) {
    if (spec_.scene)
        return paintScene(frame, index);
    paintPattern(frame, index);
    return true;
}

void FramePainter::paintPattern(AVFrame* frame, int index) {
    const int w = frame->width, h = frame->height;
    std::uint8_t* Y = frame->data[0];
    const int ys = frame->linesize[0];
    const int band = (h / 8) * 2;

    // Below the code band: a diagonal ramp that scrolls with the frame index.
    for (int y = band; y < h; ++y) {
        std::uint8_t* row = Y + y * ys;
        const int base = y + index * 4;
        for (int x = 0; x < w; ++x)
            row[x] = static_cast<std::uint8_t>(48 + ((x + base) & 127));
    }
    // A bright block bouncing across the lower part, so motion is visible.
    const int block = std::max(8, h / 6);
    const int travelX = std::max(1, w - block), travelY = std::max(1, h - band - block);
    const int bx = std::abs((index * 7) % (2 * travelX) - travelX);
    const int by = band + std::abs((index * 5) % (2 * travelY) - travelY);
    for (int y = by; y < std::min(h, by + block); ++y)
        std::memset(Y + y * ys + bx, 210, std::min(block, w - bx));

    // The code band: one cell per bit, bright for 1.
    for (int bit = 0; bit < kFrameCodeBits; ++bit) {
        const CodeCell c = codeCell(bit, w, h);
        const std::uint8_t value = ((index >> bit) & 1) ? kBright : kDark;
        for (int y = c.y0; y < c.y1; ++y)
            std::memset(Y + y * ys + c.x0, value, c.x1 - c.x0);
    }
    // Rows and columns the cells leave over (sizes not divisible by 8).
    const int codedW = (w / kCodeColumns) * kCodeColumns;
    for (int y = 0; y < band; ++y)
        std::memset(Y + y * ys + codedW, kDark, w - codedW);

    // Chroma: neutral under the code, a slowly drifting colour wave elsewhere.
    const int cw = (w + 1) / 2, ch = (h + 1) / 2;
    for (int y = 0; y < ch; ++y) {
        std::uint8_t* U = frame->data[1] + y * frame->linesize[1];
        std::uint8_t* V = frame->data[2] + y * frame->linesize[2];
        if (y * 2 < band) {
            std::memset(U, 128, cw);
            std::memset(V, 128, cw);
            continue;
        }
        for (int x = 0; x < cw; ++x) {
            U[x] = chromaWave_[(x + y + index) & 511];
            V[x] = chromaWave_[(x * 2 - y + 3 * index + 128) & 511];
        }
    }
}

bool FramePainter::paintScene(AVFrame* frame, int index) {
    const int w = frame->width, h = frame->height;
    const double t = index / spec_.fps;
    QImage image(w, h, QImage::Format_RGB32);
    QPainter p(&image);
    p.setRenderHint(QPainter::Antialiasing);

    // Wallpaper: a deep blue to teal gradient with a slow glow drifting over it.
    QLinearGradient wall(0, 0, w, h);
    wall.setColorAt(0, QColor(18, 32, 64));
    wall.setColorAt(1, QColor(20, 96, 110));
    p.fillRect(image.rect(), wall);
    QRadialGradient glow(QPointF(w * (0.3 + 0.2 * std::sin(t * 0.4)), h * 0.35), w * 0.45);
    glow.setColorAt(0, QColor(255, 190, 120, 70));
    glow.setColorAt(1, QColor(255, 190, 120, 0));
    p.fillRect(image.rect(), glow);

    // Top bar with a clock-like progress.
    const double s = h / 720.0;
    p.fillRect(QRectF(0, 0, w, 28 * s), QColor(10, 14, 24, 200));
    p.setPen(Qt::NoPen);
    p.setBrush(QColor(120, 200, 255));
    p.drawRoundedRect(QRectF(w - 220 * s, 9 * s, 200 * s * std::fmod(t / 15.0, 1.0) + 4, 10 * s),
                      5 * s, 5 * s);

    // An editor window whose lines appear as if typed.
    const QRectF win(w * 0.12, h * 0.14, w * 0.62, h * 0.72);
    p.setBrush(QColor(0, 0, 0, 90));
    p.drawRoundedRect(win.translated(8 * s, 10 * s), 14 * s, 14 * s);
    p.setBrush(QColor(36, 40, 52));
    p.drawRoundedRect(win, 14 * s, 14 * s);
    p.setBrush(QColor(52, 56, 70));
    p.drawRoundedRect(QRectF(win.left(), win.top(), win.width(), 36 * s), 14 * s, 14 * s);
    const QColor dots[] = {QColor(255, 95, 86), QColor(255, 189, 46), QColor(39, 201, 63)};
    for (int i = 0; i < 3; ++i) {
        p.setBrush(dots[i]);
        p.drawEllipse(QPointF(win.left() + (22 + 22 * i) * s, win.top() + 18 * s), 6 * s, 6 * s);
    }
    const QColor tokens[] = {QColor(198, 120, 221), QColor(97, 175, 239), QColor(152, 195, 121),
                             QColor(229, 192, 123), QColor(171, 178, 191)};
    const int typed = static_cast<int>(t * 14);
    const int lineCount = 22;
    for (int line = 0; line < lineCount; ++line) {
        const int shown = typed - line * 6;
        if (shown <= 0)
            break;
        double x = win.left() + (28 + 24 * ((line * 7) % 3)) * s;
        const double y = win.top() + (56 + line * 24) * s;
        for (int k = 0; k < std::min(shown, 6); ++k) {
            const double len = (30 + (line * 37 + k * 53) % 90) * s;
            p.setBrush(tokens[(line + k * 3) % 5]);
            p.drawRoundedRect(QRectF(x, y, len, 11 * s), 4 * s, 4 * s);
            x += len + 10 * s;
        }
    }

    // A side panel of cards that pulse gently.
    for (int i = 0; i < 4; ++i) {
        const QRectF card(w * 0.78, h * (0.16 + 0.17 * i), w * 0.18, h * 0.13);
        const int a = 120 + static_cast<int>(50 * std::sin(t * 1.3 + i));
        p.setBrush(QColor(255, 255, 255, a / 4));
        p.drawRoundedRect(card, 12 * s, 12 * s);
        p.setBrush(tokens[i]);
        p.drawEllipse(QPointF(card.left() + 26 * s, card.center().y()), 12 * s, 12 * s);
    }

    // The pointer glides along a smooth loop.
    const QPointF tip(w * (0.5 + 0.3 * std::sin(t * 0.7)), h * (0.5 + 0.25 * std::sin(t * 1.1)));
    QPainterPath arrow;
    arrow.moveTo(tip);
    arrow.lineTo(tip + QPointF(0, 22 * s));
    arrow.lineTo(tip + QPointF(6 * s, 17 * s));
    arrow.lineTo(tip + QPointF(13 * s, 17 * s));
    arrow.closeSubpath();
    p.setPen(QPen(Qt::black, 1.5 * s));
    p.setBrush(Qt::white);
    p.drawPath(arrow);
    p.end();

    sws_ = sws_getCachedContext(sws_, w, h, AV_PIX_FMT_BGRA, w, h, AV_PIX_FMT_YUV420P, SWS_BILINEAR,
                                nullptr, nullptr, nullptr);
    if (!sws_)
        return false;
    const std::uint8_t* src[] = {image.constBits()};
    const int srcStride[] = {static_cast<int>(image.bytesPerLine())};
    sws_scale(sws_, src, srcStride, 0, h, frame->data, frame->linesize);
    return true;
}

} // namespace testmedia

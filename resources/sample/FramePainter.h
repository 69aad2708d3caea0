#pragma once

#include "MediaGenerator.h"

#include <cstdint>
#include <vector>

extern "C" {
struct AVFrame;
struct SwsContext;
}

namespace testmedia {

// Draws the picture of each frame into a YUV 4:2:0 frame of the movie's coded
// size: either the test pattern (the index code in the top quarter, a moving
// gradient and a bouncing block below) or the calm desktop-like scene. One
// painter per movie; not thread-safe.
class FramePainter {
  public:
    explicit FramePainter(const MovieSpec& movieSpec);
    ~FramePainter();
    FramePainter(const FramePainter&) = delete;
    FramePainter& operator=(const FramePainter&) = delete;

    // Fills `frame` (allocated yuv420p of the coded size) with frame `index`.
    // Returns false only when the scene cannot be converted.
    bool paint(AVFrame* frame, int index);

  private:
    void paintPattern(AVFrame* frame, int index);
    bool paintScene(AVFrame* frame, int index);

    MovieSpec spec_;
    std::vector<std::uint8_t> chromaWave_;
    SwsContext* sws_ = nullptr;
};

// The cell of bit `bit` of the code band, in a frame of the given size.
struct CodeCell {
    int x0, y0, x1, y1;
};
CodeCell codeCell(int bit, int width, int height);

} // namespace testmedia

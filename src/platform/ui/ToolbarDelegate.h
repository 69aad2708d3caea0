#pragma once

namespace platform {

class Toolbar;

// Where a bar stands in its window; it decides on which edge the bar draws
// its hairline.
enum class BarPosition { Any = 0, Bottom = 1, Top = 2, TopAttached = 3 };

// The delegate of a toolbar (held weakly by it). Main thread only.
class ToolbarDelegate {
  public:
    virtual ~ToolbarDelegate() = default;
    // The default places bars by where they are in their superview: a bar in
    // the upper half is at the top.
    virtual BarPosition positionForBar(Toolbar& bar);
};

} // namespace platform

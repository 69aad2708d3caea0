#pragma once

#include <QSizeF>
#include <functional>
#include <memory>
#include <vector>

namespace platform {

// Coordinates the changes that go with a transition (a window resize). The
// code told of the transition adds blocks to run alongside its animation and
// blocks to run when it completes. The transition then runs the alongside
// blocks inside one animation (so alpha changes in them animate) with the
// views already at their new size, and the completions after that animation
// ends. Main thread only; kept alive by its own run until the completions
// have run.
class TransitionCoordinator : public std::enable_shared_from_this<TransitionCoordinator> {
  public:
    using Block = std::function<void(TransitionCoordinator& context)>;

    static std::shared_ptr<TransitionCoordinator> make(double duration, bool animated = true);

    // Either block may be empty. Returns true (blocks are always accepted
    // before the transition runs; after it, false and nothing is kept).
    bool animateAlongsideTransition_completion(Block alongside, Block completion);

    double transitionDuration() const { return duration_; }
    bool isAnimated() const { return animated_; }
    bool isCancelled() const { return false; }
    bool hasRun() const { return ran_; }

    // Runs the transition: the alongside blocks now, the completions when the
    // animation they started has ended (on a later turn of the event loop).
    void run();

  private:
    TransitionCoordinator(double duration, bool animated)
        : duration_(duration), animated_(animated) {}

    double duration_;
    bool animated_;
    bool ran_ = false;
    std::vector<Block> alongside_;
    std::vector<Block> completions_;
};

} // namespace platform

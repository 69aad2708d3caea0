#include "platform/ui/TransitionCoordinator.h"

#include "platform/ui/Animation.h"

namespace platform {

std::shared_ptr<TransitionCoordinator> TransitionCoordinator::make(double duration, bool animated) {
    return std::shared_ptr<TransitionCoordinator>(new TransitionCoordinator(duration, animated));
}

bool TransitionCoordinator::animateAlongsideTransition_completion(Block alongside,
                                                                  Block completion) {
    if (ran_)
        return false;
    if (alongside)
        alongside_.push_back(std::move(alongside));
    if (completion)
        completions_.push_back(std::move(completion));
    return true;
}

void TransitionCoordinator::run() {
    if (ran_)
        return;
    ran_ = true;
    auto self = shared_from_this();
    Animation::animateWithDuration(
        animated_ ? duration_ : 0.0,
        [self] {
            for (const Block& block : self->alongside_)
                block(*self);
        },
        [self](bool) {
            for (const Block& block : self->completions_)
                block(*self);
            self->alongside_.clear();
            self->completions_.clear();
        });
}

} // namespace platform

#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <utility>

namespace platform {

template <typename Signature> class Implementation;

// The one place that chooses how a platform service is made: the real maker,
// unless a test has put another in its place. Each service keeps one of these
// behind its static factory (ExportSession::implementation(), say), so the
// system asks for a service the same way whichever implementation it gets.
//
// Threads: make() may be called from any thread. replace() is meant for a
// test's set-up; a service made before the replacement stays what it is.
// Ownership: the maker is copied in; the returned Replacement puts the
// previous maker back when it goes (replacements nest, last in, first out).
template <typename Result, typename... Args> class Implementation<Result(Args...)> {
  public:
    using Maker = std::function<Result(Args...)>;

    explicit Implementation(Maker real) : maker_(std::make_shared<Maker>(std::move(real))) {}
    Implementation(const Implementation&) = delete;
    Implementation& operator=(const Implementation&) = delete;

    Result make(Args... args) const {
        std::shared_ptr<Maker> maker;
        {
            std::lock_guard lock(mutex_);
            maker = maker_;
        }
        return (*maker)(std::forward<Args>(args)...);
    }

    class [[nodiscard]] Replacement {
      public:
        Replacement(Replacement&& other) noexcept
            : owner_(std::exchange(other.owner_, nullptr)), previous_(std::move(other.previous_)) {}
        Replacement(const Replacement&) = delete;
        Replacement& operator=(const Replacement&) = delete;
        Replacement& operator=(Replacement&&) = delete;
        ~Replacement() {
            if (owner_)
                owner_->swapIn(std::move(previous_));
        }

      private:
        friend class Implementation;
        Replacement(Implementation* owner, std::shared_ptr<Maker> previous)
            : owner_(owner), previous_(std::move(previous)) {}
        Implementation* owner_;
        std::shared_ptr<Maker> previous_;
    };

    // Makes `maker` the one used until the returned value goes.
    Replacement replace(Maker maker) {
        return Replacement(this, swapIn(std::make_shared<Maker>(std::move(maker))));
    }

  private:
    std::shared_ptr<Maker> swapIn(std::shared_ptr<Maker> maker) {
        std::lock_guard lock(mutex_);
        std::swap(maker_, maker);
        return maker;
    }

    mutable std::mutex mutex_;
    std::shared_ptr<Maker> maker_;
};

} // namespace platform

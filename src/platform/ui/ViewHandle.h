#pragma once

#include <QPointer>
#include <QWidget>
#include <utility>

namespace platform {

// A strong reference to a view, for views that may leave their superview and
// come back (a toolbar that is removed and re-added, a spinner kept after it
// was taken off screen). While the view is in a superview, the superview owns
// it as well; when the view is detached, the last handle to let go deletes it
// (on a later turn of the event loop). If the superview deletes the view
// first, the handle becomes null. Main thread only.
namespace ViewHandles {
int count(const QWidget* view);
void retain(QWidget* view);
void release(QWidget* view); // deletes a detached view once nothing holds it
} // namespace ViewHandles

template <class T> class ViewHandle {
  public:
    ViewHandle() = default;
    ViewHandle(T* view) : view_(view) { ViewHandles::retain(view); }
    ViewHandle(const ViewHandle& other) : ViewHandle(other.get()) {}
    ViewHandle(ViewHandle&& other) noexcept : view_(std::exchange(other.view_, nullptr)) {}
    ~ViewHandle() { reset(); }

    ViewHandle& operator=(ViewHandle other) noexcept {
        std::swap(view_, other.view_);
        return *this;
    }

    void reset() {
        // As a QWidget: a view in the middle of its destruction is one no more.
        if (QObject* view = view_.data())
            ViewHandles::release(static_cast<QWidget*>(view));
        view_ = nullptr;
    }

    T* get() const { return static_cast<T*>(view_.data()); }
    T* operator->() const { return get(); }
    T& operator*() const { return *get(); }
    explicit operator bool() const { return !view_.isNull(); }

    // Whether `object` is the view held. Safe in the view's own destruction
    // (event filters see it then), when it can no longer be taken as a T.
    bool holds(const QObject* object) const { return object && object == view_.data(); }

  private:
    // Held as a QObject, so that nothing casts a view that is half destroyed.
    QPointer<QObject> view_;
};

} // namespace platform

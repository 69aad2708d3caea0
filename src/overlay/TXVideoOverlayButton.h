#pragma once

#include <QByteArray>
#include <QObject>
#include <QWidget>

// The large play button over the video, in either of its two styles. Both
// report a tap by sending `action` (an invokable method or slot, by name) to
// `target`, which they hold weakly, with the overlay button itself as the one
// argument when the method takes one. The concrete classes are made with the
// style (their constructor is `initWithStyle:`), normally through
// ViewSRExtensions::_srVideoOverlayButtonWithStyle. Main thread only.
class TXVideoOverlayButton {
  public:
    virtual ~TXVideoOverlayButton() = default;

    virtual long style() const = 0;
    virtual void setTarget_action(QObject* target, const QByteArray& action) = 0;
    // The button as a view, to place in the view tree.
    virtual QWidget* view() = 0;
};

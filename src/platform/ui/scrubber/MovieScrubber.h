#pragma once

#include "platform/ui/scrubber/MovieScrubberDataSource.h"
#include "platform/ui/scrubber/MovieScrubberDelegate.h"
#include "platform/ui/scrubber/ScrubberTimeline.h"
#include "platform/ui/scrubber/ThumbnailStrip.h"
#include "platform/ui/scrubber/TrimRange.h"

#include <QColor>
#include <QImage>
#include <QTimer>
#include <QWidget>
#include <memory>

class QVariantAnimation;

namespace platform {

// The movie scrubber: a strip of thumbnails of one movie with a playhead and,
// when editable, two trim handles. A dumb control: it reports what the user
// does to its delegate and shows what it is told (value, images, editing); it
// never touches a player.
//
// Main thread only. Delegate and data source are held weakly (std::weak_ptr):
// the owner keeps them alive, the scrubber locks them for the length of one
// call and does nothing when they are gone.
//
// Times are seconds from the start of the movie; lengths on screen are
// device-independent pixels (points).
//
// Input: mouse, touch (first touch point) and keyboard. The keyboard works on
// one focused part at a time (playhead, start handle, end handle; Tab and
// Shift+Tab move between them): Left/Right step one frame, with Shift ten
// frames or a second, whichever is longer; Home/End go to the limits; Escape
// leaves editing.
class MovieScrubber : public QWidget {
    Q_OBJECT

  public:
    using Handle = MovieScrubberHandle;

    explicit MovieScrubber(QWidget* parent = nullptr);
    ~MovieScrubber() override;

    void setDelegate(std::weak_ptr<MovieScrubberDelegate> delegate);
    std::weak_ptr<MovieScrubberDelegate> delegate() const { return delegate_; }
    void setDataSource(std::weak_ptr<MovieScrubberDataSource> dataSource);
    std::weak_ptr<MovieScrubberDataSource> dataSource() const { return dataSource_; }

    // Asks the data source again: duration, aspect ratio, time stamps, then one
    // image request per stamp. Pictures shown so far are dropped and images
    // still on their way for stamps no longer on the strip are ignored. Ends a
    // gesture in progress (a playhead drag gets its end call). The trim range
    // is kept when the duration is unchanged, else it becomes the whole movie.
    void reloadData();
    // The answer to a thumbnail request. A null image or a stamp that is not
    // on the strip (any more) is ignored.
    void setThumbnailImage_forTimestamp(const QImage& image, double timestamp);
    // The duration read by the last reloadData; 0 when there is no movie.
    double duration() const { return timeline_.duration(); }
    // The stamps currently on the overview strip, left to right.
    QList<double> timestamps() const { return overview_.timestamps(); }

    // The playhead, in seconds. Setting it only moves the drawing; the delegate
    // hears only of the user's moves. A value that is not a number hides the
    // playhead; values outside the movie are drawn at its ends.
    double value() const { return value_; }
    void setValue(double seconds);

    // Whether the user may trim. Without it there are no handles and no
    // editing. Default false.
    bool isEditable() const { return editable_; }
    void setEditable(bool editable);
    // In editing mode the trim range is framed in the tint colour and the
    // playhead keeps inside it. Setting it tells the delegate nothing; leaving
    // editing ends a handle drag. Entering needs `editable`.
    bool isEditing() const { return editing_; }
    void setEditing_animated(bool editing, bool animated);

    // Least distance between the handles, seconds (default 1.0; not a
    // positive number counts as 0).
    double minimumTrimLength() const { return range_.minimumLength(); }
    void setMinimumTrimLength(double seconds);
    // The trim range. The setters apply the same bounds as the handles and
    // tell the delegate nothing.
    double startValue() const { return range_.start(); }
    double endValue() const { return range_.end(); }
    void setStartValue(double seconds);
    void setEndValue(double seconds);

    // How long, in seconds, a held handle stays still before the strip zooms
    // for fine trimming (default 0.5); not a positive number turns zooming
    // off. The strip zooms back when the handle is let go.
    double zoomDelay() const { return zoomDelay_; }
    void setZoomDelay(double seconds);
    // Magnification of the zoomed strip (default 10; at least 1).
    double zoomFactor() const { return zoomFactor_; }
    void setZoomFactor(double factor);
    bool isZoomed() const { return timeline_.isZoomed(); }

    // Horizontal room, in points, left of and right of the thumbnail strip;
    // the handles stand in it at the movie's ends (default 10).
    float edgeInset() const { return edgeInset_; }
    void setEdgeInset(float points);

    // Length of one frame for the arrow keys, seconds; 0 (default) asks the
    // data source, then falls back to 1/30 s.
    double frameDuration() const { return frameDuration_; }
    void setFrameDuration(double seconds);

    // Colour of the trim frame in editing mode (default a warm yellow).
    QColor tintColor() const { return tintColor_; }
    void setTintColor(const QColor& color);

    // Where `seconds` is drawn, in widget x (the current, possibly zooming,
    // view), and the time under widget x in the view the user's hand works in.
    double positionForTime(double seconds) const;
    double timeAtPosition(double x) const;
    // The part the keyboard works on.
    Handle focusedPart() const { return focusPart_; }
    // Text for assistive technology: the focused part and its time.
    QString accessibleValueText() const;
    // Moves the focused part to `seconds` as the user would, with the same
    // bounds and delegate calls; for assistive technology. Returns whether it
    // moved.
    bool moveFocusedPartTo(double seconds);
    // Moves `part` to `seconds` as the keyboard does: the playhead in one
    // whole scrub (begin, value, end), a handle within its bounds, entering
    // editing first. Nothing happens, and false comes back, when the part
    // would not move, there is no movie or a pointer gesture is under way.
    bool movePartTo(Handle part, double seconds);
    // Steps `part` by one frame (`large`: ten frames or a second, whichever
    // is longer) backwards (`direction` < 0) or forwards, as the arrow keys
    // do. Returns whether it moved.
    bool stepPart(Handle part, int direction, bool large);
    // Sets the start or end handle as pressing and dragging it does: editing
    // begins when it has not (the delegate hears movieScrubberDidBeginEditing
    // even if the handle then stays where it is), then the handle moves to
    // `seconds` within its bounds (the delegate hears the new value). False
    // when the scrubber is not editable, has no movie, or a pointer gesture is
    // under way.
    bool trimHandleTo(Handle handle, double seconds);

    QSize sizeHint() const override;
    QSize minimumSizeHint() const override;

  protected:
    bool event(QEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void hideEvent(QHideEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void focusInEvent(QFocusEvent* event) override;
    void focusOutEvent(QFocusEvent* event) override;
    bool focusNextPrevChild(bool next) override;

  private:
    enum class Gesture { None, Playhead, Start, End };

    // Layout and data (MovieScrubber.cpp)
    QRectF trackRect() const;
    double handleWidth() const;
    void updateTrack();
    void layoutThumbnails(bool keepImages);
    void requestThumbnails(const ThumbnailStrip& strip, const QList<double>& stamps);
    double thumbnailWidth() const;
    int thumbnailCount(double pixels) const;
    TimelineMapping drawingMapping() const;
    void animateEditingAppearance(bool animated);
    void animateZoom(double target);
    void notifyValueChanged();

    // Pointer input (MovieScrubber_Input.cpp)
    Gesture hitTest(double x, bool touch) const;
    void beginGesture(double x, bool touch);
    void moveGesture(double x);
    void endGesture();
    void zoomIn();
    void zoomOut();
    bool enterEditingByUser();
    void userSetValue(double seconds);
    void userSetHandle(Handle handle, double seconds);
    double clampPlayhead(double seconds) const;

    // Keyboard (MovieScrubber_Keys.cpp)
    QList<Handle> focusableParts() const;
    double effectiveFrameDuration();
    double partTime(Handle part) const;

    // Painting (MovieScrubber_Paint.cpp)
    void paintThumbnails(QPainter& painter, const QRectF& track, const TimelineMapping& map) const;
    void paintTrimFrame(QPainter& painter, const QRectF& track, const TimelineMapping& map) const;
    void paintPlayhead(QPainter& painter, const QRectF& track, const TimelineMapping& map) const;
    void paintFocus(QPainter& painter, const QRectF& track, const TimelineMapping& map) const;

    std::weak_ptr<MovieScrubberDelegate> delegate_;
    std::weak_ptr<MovieScrubberDataSource> dataSource_;

    ScrubberTimeline timeline_;
    TrimRange range_;
    ThumbnailStrip overview_;
    ThumbnailStrip zoomed_;
    float aspectRatio_ = 1.0f;
    bool loaded_ = false;
    // Bumped whenever the strips are rebuilt, so a loop of requests notices a
    // data source that reloaded from inside a request.
    unsigned generation_ = 0;

    double value_ = 0.0;
    bool editable_ = false;
    bool editing_ = false;
    double zoomDelay_ = 0.5;
    double zoomFactor_ = 10.0;
    float edgeInset_ = 10.0f;
    double frameDuration_ = 0.0;
    QColor tintColor_{255, 204, 0};

    Gesture gesture_ = Gesture::None;
    double grabOffset_ = 0.0;  // pointer x minus the held handle's x
    double pointerX_ = 0.0;    // last pointer x during a gesture
    double holdOriginX_ = 0.0; // where the pointer came to rest
    int touchPointId_ = -1;    // the touch point a touch gesture follows
    QTimer zoomTimer_;

    Handle focusPart_ = Handle::Playhead;

    double editingAppearance_ = 0.0; // 0 plain .. 1 framed, animated
    double zoomProgress_ = 0.0;      // 0 overview .. 1 zoomed, animated
    QVariantAnimation* editingAnimation_ = nullptr;
    QVariantAnimation* zoomAnimation_ = nullptr;
};

} // namespace platform

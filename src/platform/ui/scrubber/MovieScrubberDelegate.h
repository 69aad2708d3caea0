#pragma once

namespace platform {

class MovieScrubber;

// Which part of the scrubber the user holds.
enum class MovieScrubberHandle {
    Playhead,
    Start, // the trim range's start handle
    End,   // the trim range's end handle
};

// What the user did with a MovieScrubber. Every call arrives on the main
// thread, from inside the scrubber's event handling, with the scrubber as first
// argument. The scrubber holds its delegate weakly and keeps it alive only for
// the length of one call. A delegate may call back into the scrubber from any of
// these (to leave editing, set its value, reload it); the scrubber copes.
//
// Values are seconds from the start of the movie. The scrubber has already
// applied its bounds when it reports them: the playhead lies inside the movie
// (inside the trim range while editing), the start and end handles inside the
// movie and at least `minimumTrimLength` apart.
class MovieScrubberDelegate {
  public:
    virtual ~MovieScrubberDelegate() = default;

    // The playhead moved under the user's hand (drag, click, arrow key). Only
    // changes are reported: the same value is never sent twice in a row.
    virtual void movieScrubber_valueDidChange(MovieScrubber* scrubber, double value) = 0;

    // The user took the playhead; value changes follow, then the end call.
    // Every begin is matched by exactly one end, also when the gesture is
    // interrupted (the scrubber hidden, a touch cancelled, data reloaded).
    virtual void movieScrubberDidBeginScrubbing_withHandle(MovieScrubber* scrubber,
                                                           MovieScrubberHandle handle) = 0;
    virtual void movieScrubberDidEndScrubbing_withHandle(MovieScrubber* scrubber,
                                                         MovieScrubberHandle handle) = 0;

    // The user took a trim handle while not editing; the scrubber is now in
    // editing mode. Sent once per entry into editing, before the first value.
    virtual void movieScrubberDidBeginEditing(MovieScrubber* scrubber) = 0;

    // A trim handle moved. Only changes are reported.
    virtual void movieScrubber_editingStartValueDidChange(MovieScrubber* scrubber,
                                                          double value) = 0;
    virtual void movieScrubber_editingEndValueDidChange(MovieScrubber* scrubber, double value) = 0;

    // The user abandoned trimming (Escape while editing). The scrubber has
    // already left editing mode when this arrives.
    virtual void movieScrubberDidCancelEditing(MovieScrubber* scrubber) = 0;
};

} // namespace platform

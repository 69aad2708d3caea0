#pragma once

#include "platform/ui/scrubber/MovieScrubber.h"

#include <QString>
#include <QStringList>
#include <functional>
#include <vector>

namespace testing_support {

// Delegate and data source of a MovieScrubber that writes down every call, in
// order, and answers the data-source questions from its settings. Time stamps
// are evenly spaced as the editor makes them: start + i * (end - start) /
// count, stopping after the first one past the duration.
class RecordingScrubberClient : public platform::MovieScrubberDelegate,
                                public platform::MovieScrubberDataSource {
  public:
    struct Call {
        QString name; // "value", "beginScrubbing", "start", "stamps", "request", ...
        double value = 0.0;
        int count = 0;    // "stamps" only
        double end = 0.0; // "stamps" only; value holds the start
    };

    double duration = 10.0;
    float aspectRatio = 1.0f;
    double frame = 0.0;
    std::vector<Call> calls;
    // Run inside the matching call, to test reentrancy.
    std::function<void(platform::MovieScrubber*)> onBeginScrubbing;
    std::function<void(platform::MovieScrubber*)> onCancelEditing;

    QStringList names() const;
    std::vector<double> valuesOf(const QString& name) const;
    std::vector<Call> callsNamed(const QString& name) const;
    // Forgets what was recorded so far.
    void clear() { calls.clear(); }

    void movieScrubber_valueDidChange(platform::MovieScrubber*, double value) override;
    void movieScrubberDidBeginScrubbing_withHandle(platform::MovieScrubber*,
                                                   platform::MovieScrubberHandle) override;
    void movieScrubberDidEndScrubbing_withHandle(platform::MovieScrubber*,
                                                 platform::MovieScrubberHandle) override;
    void movieScrubberDidBeginEditing(platform::MovieScrubber*) override;
    void movieScrubber_editingStartValueDidChange(platform::MovieScrubber*, double value) override;
    void movieScrubber_editingEndValueDidChange(platform::MovieScrubber*, double value) override;
    void movieScrubberDidCancelEditing(platform::MovieScrubber*) override;

    double movieScrubberDuration(platform::MovieScrubber*) override;
    float movieScrubberThumbnailAspectRatio(platform::MovieScrubber*) override;
    QList<double> movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(platform::MovieScrubber*,
                                                                           int count, double start,
                                                                           double end) override;
    void movieScrubber_requestThumbnailImageForTimestamp(platform::MovieScrubber*,
                                                         double timestamp) override;
    double movieScrubberFrameDuration(platform::MovieScrubber*) override { return frame; }
};

} // namespace testing_support

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
// count, none past the duration but the first.
class RecordingScrubberClient : public platform::MovieScrubberDelegate,
                                public platform::MovieScrubberDataSource {
  public:
    using Scrubber = platform::MovieScrubber;
    using Handle = platform::MovieScrubberHandle;
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
    std::function<void(Scrubber*)> onBeginScrubbing;
    std::function<void(Scrubber*)> onCancelEditing;

    QStringList names() const {
        QStringList out;
        for (const Call& call : calls)
            out << call.name;
        return out;
    }
    std::vector<Call> callsNamed(const QString& name) const {
        std::vector<Call> out;
        std::copy_if(calls.begin(), calls.end(), std::back_inserter(out),
                     [&](const Call& call) { return call.name == name; });
        return out;
    }
    std::vector<double> valuesOf(const QString& name) const {
        std::vector<double> out;
        for (const Call& call : callsNamed(name))
            out.push_back(call.value);
        return out;
    }

    void movieScrubber_valueDidChange(Scrubber*, double v) override { note("value", v); }
    void movieScrubberDidBeginScrubbing_withHandle(Scrubber* scrubber, Handle) override {
        note("beginScrubbing");
        if (onBeginScrubbing)
            onBeginScrubbing(scrubber);
    }
    void movieScrubberDidEndScrubbing_withHandle(Scrubber*, Handle) override {
        note("endScrubbing");
    }
    void movieScrubberDidBeginEditing(Scrubber*) override { note("beginEditing"); }
    void movieScrubber_editingStartValueDidChange(Scrubber*, double v) override {
        note("start", v);
    }
    void movieScrubber_editingEndValueDidChange(Scrubber*, double v) override { note("end", v); }
    void movieScrubberDidCancelEditing(Scrubber* scrubber) override {
        note("cancelEditing");
        if (onCancelEditing)
            onCancelEditing(scrubber);
    }

    double movieScrubberDuration(Scrubber*) override { return note("duration"), duration; }
    float movieScrubberThumbnailAspectRatio(Scrubber*) override {
        return note("aspectRatio"), aspectRatio;
    }
    QList<double> movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(Scrubber*, int count,
                                                                           double start,
                                                                           double end) override {
        calls.push_back({"stamps", start, count, end});
        QList<double> stamps;
        for (int i = 0; i < count; ++i) {
            const double t = start + i * (end - start) / count;
            if (i > 0 && t > duration)
                break;
            stamps << t;
        }
        return stamps;
    }
    void movieScrubber_requestThumbnailImageForTimestamp(Scrubber*, double t) override {
        note("request", t);
    }
    double movieScrubberFrameDuration(Scrubber*) override { return frame; }

  private:
    void note(const char* name, double value = 0.0) { calls.push_back({name, value}); }
};

} // namespace testing_support

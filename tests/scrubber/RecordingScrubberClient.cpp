#include "scrubber/RecordingScrubberClient.h"

namespace testing_support {

QStringList RecordingScrubberClient::names() const {
    QStringList out;
    for (const Call& call : calls)
        out << call.name;
    return out;
}

std::vector<double> RecordingScrubberClient::valuesOf(const QString& name) const {
    std::vector<double> out;
    for (const Call& call : calls)
        if (call.name == name)
            out.push_back(call.value);
    return out;
}

std::vector<RecordingScrubberClient::Call>
RecordingScrubberClient::callsNamed(const QString& name) const {
    std::vector<Call> out;
    for (const Call& call : calls)
        if (call.name == name)
            out.push_back(call);
    return out;
}

void RecordingScrubberClient::movieScrubber_valueDidChange(platform::MovieScrubber*, double value) {
    calls.push_back({"value", value});
}

void RecordingScrubberClient::movieScrubberDidBeginScrubbing_withHandle(
    platform::MovieScrubber* scrubber, platform::MovieScrubberHandle) {
    calls.push_back({"beginScrubbing"});
    if (onBeginScrubbing)
        onBeginScrubbing(scrubber);
}

void RecordingScrubberClient::movieScrubberDidEndScrubbing_withHandle(
    platform::MovieScrubber*, platform::MovieScrubberHandle) {
    calls.push_back({"endScrubbing"});
}

void RecordingScrubberClient::movieScrubberDidBeginEditing(platform::MovieScrubber*) {
    calls.push_back({"beginEditing"});
}

void RecordingScrubberClient::movieScrubber_editingStartValueDidChange(platform::MovieScrubber*,
                                                                       double value) {
    calls.push_back({"start", value});
}

void RecordingScrubberClient::movieScrubber_editingEndValueDidChange(platform::MovieScrubber*,
                                                                     double value) {
    calls.push_back({"end", value});
}

void RecordingScrubberClient::movieScrubberDidCancelEditing(platform::MovieScrubber* scrubber) {
    calls.push_back({"cancelEditing"});
    if (onCancelEditing)
        onCancelEditing(scrubber);
}

double RecordingScrubberClient::movieScrubberDuration(platform::MovieScrubber*) {
    calls.push_back({"duration"});
    return duration;
}

float RecordingScrubberClient::movieScrubberThumbnailAspectRatio(platform::MovieScrubber*) {
    calls.push_back({"aspectRatio"});
    return aspectRatio;
}

QList<double> RecordingScrubberClient::movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(
    platform::MovieScrubber*, int count, double start, double end) {
    calls.push_back({"stamps", start, count, end});
    QList<double> stamps;
    if (count < 1)
        return stamps;
    const double step = (end - start) / count;
    double t = start;
    for (int i = 1;; ++i) {
        stamps << t;
        t += step;
        if (t > duration || i >= count)
            break;
    }
    return stamps;
}

void RecordingScrubberClient::movieScrubber_requestThumbnailImageForTimestamp(
    platform::MovieScrubber*, double timestamp) {
    calls.push_back({"request", timestamp});
}

} // namespace testing_support

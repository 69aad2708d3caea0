#pragma once

#include "ClipProbe.h"
#include "MediaGenerator.h"
#include "platform/media/ExportSession.h"

#include <QString>

#include <memory>
#include <thread>

// Running exports and checking the clips they write, for the media tests.
namespace mediatest {

// Runs an export and waits for its one completion; records the thread it
// came on.
struct ExportRun {
    explicit ExportRun(std::shared_ptr<platform::ExportSession> s) : session(std::move(s)) {}
    std::shared_ptr<platform::ExportSession> session;
    int completions = 0;
    std::thread::id completionThread;

    bool runAndWait(int timeoutMs = 60000);
    // The session's error, for test messages.
    std::string why() const;
};

// A session on `source` writing `output` for [start, start + duration) in
// seconds of the movie (0 is its first sample).
std::shared_ptr<platform::ExportSession> makeSession(const QString& source, const QString& preset,
                                                     const QString& output, double start,
                                                     double duration);

// The index of the frame shown at `seconds` of the generator's timeline.
int frameAt(const testmedia::MovieSpec& movieSpec, double seconds);

// Temporary files of the export left beside `output`.
bool leftovers(const QString& output);

// The clip at `output`, cut from a movie made from `movieSpec` (`source`)
// for [start, start + duration) of the movie, is what a user asked for: an
// MP4 that decodes without one error line, with rising decode times, whose
// first picture is the one the movie showed at `start`, that lasts the range
// within a frame, and whose audio bursts fall where the pictures say (the
// second track's too when `mixed`).
void expectFaithfulCut(const testmedia::MovieSpec& movieSpec, const QString& source,
                       const QString& output, double start, double duration, bool mixed = false);

// A checksum of a file's bytes, to show that a recording was not written to.
QByteArray fileDigest(const QString& path);

} // namespace mediatest

#pragma once

#include "ClipProbe.h"
#include "MediaGenerator.h"
#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"

#include <QString>
#include <gtest/gtest.h>

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
};

// A session on `asset` (or the movie at `source`) writing an MP4 to `output`
// for [start, start + duration) in seconds of the movie (0 is its first
// sample).
std::shared_ptr<platform::ExportSession>
makeSession(std::shared_ptr<platform::Asset> asset, const QString& output, double start,
            double duration, const QString& preset = platform::ExportPresetPassthrough);
std::shared_ptr<platform::ExportSession>
makeSession(const QString& source, const QString& output, double start, double duration,
            const QString& preset = platform::ExportPresetPassthrough);

// Runs the export; success when it completed, else the session's error.
testing::AssertionResult completes(ExportRun& run, int timeoutMs = 120000);
testing::AssertionResult completes(const std::shared_ptr<platform::ExportSession>& session,
                                   int timeoutMs = 120000);

// Temporary files of the export left beside `output`.
bool leftovers(const QString& output);

// The clip at `output`, cut from a movie made from `movieSpec` (`source`)
// for [start, start + duration) of the movie, is what a user asked for: an
// MP4 that decodes without one error line, with rising decode times, turned
// as the movie is, whose first picture is the one the movie showed at
// `start`, that lasts the range within a frame, whose audio bursts fall where
// the pictures say (the second track's too when `mixed`), with no temporary
// file left beside it.
void expectFaithfulCut(const testmedia::MovieSpec& movieSpec, const QString& source,
                       const QString& output, double start, double duration, bool mixed = false);

} // namespace mediatest

// A pass-through export in a process of its own, for the tests that measure
// one: tamsel-test-export SOURCE OUTPUT START DURATION. Exits 0 when the
// export completed, printing the process's peak resident memory in KiB.

#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"

#include <QCoreApplication>
#include <QFile>

#include <sys/resource.h>

#include <condition_variable>
#include <cstdio>
#include <mutex>

using namespace platform;

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    if (argc != 5)
        return 2;
    auto session = ExportSession::exportSessionWithAsset_presetName(
        Asset::assetWithURL(QUrl::fromLocalFile(QFile::decodeName(argv[1]))),
        ExportPresetPassthrough);
    session->setOutputURL(QUrl::fromLocalFile(QFile::decodeName(argv[2])));
    session->setOutputFileType(FileTypeMPEG4);
    session->setTimeRange(MediaTimeRange::make(MediaTime::fromSeconds(std::atof(argv[3]), 600),
                                               MediaTime::fromSeconds(std::atof(argv[4]), 600)));
    std::mutex m;
    std::condition_variable cv;
    bool done = false;
    session->exportAsynchronouslyWithCompletionHandler([&] {
        std::lock_guard lock(m);
        done = true;
        cv.notify_all();
    });
    std::unique_lock lock(m);
    cv.wait(lock, [&] { return done; });
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    std::printf("%ld\n", usage.ru_maxrss);
    return session->status() == int(ExportSessionStatus::Completed) ? 0 : 1;
}

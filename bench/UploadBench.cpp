// tamsel-upload-bench FILE: one upload of FILE through the plug-in's upload
// client and sign-in, as the editor publishes, to the service the environment
// names (bench/run starts the local fake and points TAMSEL_YOUTUBE_* at it).
// The account is a refresh token given in TAMSEL_BENCH_REFRESH_TOKEN. Exits 0
// when the service answered with the video.
#include "RefreshTokenStore.h"
#include "YouTubeGoogleSignIn.h"
#include "YouTubeResumableUploadClient.h"

#include <QCoreApplication>

#include <cstdio>

int main(int argc, char** argv) {
    // No secret store: the benchmark's account lives in memory only.
    qputenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/tamsel-bench-bus");
    QCoreApplication app(argc, argv);
    if (argc != 2) {
        std::fprintf(stderr, "usage: %s FILE\n", argv[0]);
        return 2;
    }
    youtube_publishing::RefreshTokenStore::shared().save(
        qEnvironmentVariable("TAMSEL_YOUTUBE_CLIENT_ID"),
        qEnvironmentVariable("TAMSEL_BENCH_REFRESH_TOKEN"));
    auto client = std::make_shared<YouTubeResumableUploadClient>();
    client->setSignIn(std::make_shared<YouTubeGoogleSignIn>());
    if (const int mebibytes = qEnvironmentVariableIntValue("TAMSEL_BENCH_CHUNK_MIB")) {
        auto policy = client->policy();
        policy.chunkSize = qint64(mebibytes) << 20;
        client->setPolicy(policy);
    }
    platform::YouTubeUpload upload;
    upload.filePath = QString::fromLocal8Bit(argv[1]);
    upload.title = QStringLiteral("Benchmark");
    upload.privacyStatus = QStringLiteral("private");
    int status = 1;
    client->upload(
        upload, [](qint64, qint64) {},
        [&](const platform::YouTubeUploadResult& result, platform::ErrorPtr error) {
            if (error)
                std::fprintf(stderr, "%s\n", qPrintable(error->description()));
            status = error || result.videoId.isEmpty() ? 1 : 0;
            app.quit();
        });
    app.exec();
    return status;
}

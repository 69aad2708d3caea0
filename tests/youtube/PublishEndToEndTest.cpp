// Publishing as a host sees it: tamsel-edit on a real X server (Xvfb), the
// share button, YouTube in the sheet, the real plug-in against the local fake
// of the service, the browser's sign-in and the desktop's opener played by a
// fake xdg-open on the PATH. The form and the progress overlay are kept as
// screenshots in the build tree's publish-screenshots folder.

#include "FakeYouTubeServer.h"
#include "ShareDesktop.h"
#include "platform/media/Asset.h"

#include <QColor>
#include <QCoreApplication>
#include <QDir>
#include <QImage>

using testing_support::FakeYouTubeServer;

namespace {

const QString kDescription = QStringLiteral(
    "Check out my recording of Racer by Example Games! appstream://org.example.Racer");

double meanLightness(const QImage& image) {
    double sum = 0;
    int count = 0;
    for (int y = 0; y < image.height(); y += 4)
        for (int x = 0; x < image.width(); x += 4, ++count)
            sum += QColor(image.pixel(x, y)).lightnessF();
    return count ? sum / count : 0;
}

class PublishEndToEnd : public ShareDesktop {
  protected:
    void SetUp() override {
        ShareDesktop::SetUp();
        // The desktop's opener: notes the address; a sign-in page of the
        // local service is followed as a browser does once the user agrees.
        program("xdg-open", "printf '%s\\n' \"$1\" >> '" +
                                desktop.filePath("opened.txt").toLocal8Bit() +
                                "'\ncase \"$1\" in http://127.0.0.1:*) curl -s -L -o /dev/null "
                                "--max-time 60 \"$1\" & ;; esac\n");
        QDir().mkpath(desktop.filePath("storage"));
        ASSERT_TRUE(server.start());
        for (const QString& line : server.environment())
            env.insert(line.section('=', 0, 0), line.section('=', 1));
    }

    FakeYouTubeServer server{desktop.filePath("storage")};
};

} // namespace

TEST_F(PublishEndToEnd, PublishedFromTheSheetViewedInTheBrowserAndReportedToTheHost) {
    const QString shots = QCoreApplication::applicationDirPath() + "/publish-screenshots";
    QDir().mkpath(shots);
    bool skipped = false;
    const Run run = editUnderXvfb(QStringLiteral(R"(wait ready
tap shareButton
share YouTube
wait form
dump
screenshot "%1/publish-form.png"
fill title "Racer lap"
press "Publish"
wait publishing
screenshot "%1/publish-progress.png"
wait alert 120
dump
press "View on YouTube"
sleep 1
tap doneButton
)")
                                      .arg(shots),
                                  QSize(1024, 768), {}, env, &skipped);
    ASSERT_FALSE(skipped) << "xvfb-run is not installed";
    EXPECT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(tempFiles(), QStringList()) << "the upload file goes with the editor";
    EXPECT_EQ(run.hostReport, R"(["TXPublishToYouTube"])");
    // The form as the activity filled it, then the published video's alert.
    ASSERT_EQ(run.dumps.size(), 2) << run.out.toStdString();
    EXPECT_EQ(run.dumps[0]["publishingDescription"].toString(), kDescription);
    EXPECT_EQ(run.dumps[0]["publishingCategory"].toString(), "20");
    EXPECT_TRUE(run.dumps[0]["alert"].isNull());
    EXPECT_EQ(run.dumps[1]["alert"].toString(), "Your video has been published.");
    EXPECT_DOUBLE_EQ(run.dumps[1]["uploadProgress"].toDouble(), 1.0);

    // What arrived: the recording, whole, with the form's text and category.
    const auto uploads = server.record().uploads;
    ASSERT_EQ(uploads.size(), 1);
    const auto& upload = uploads[0];
    EXPECT_TRUE(upload.complete);
    EXPECT_EQ(
        QStringList({upload.title, upload.description, upload.categoryId, upload.privacyStatus}),
        QStringList({"Racer lap", kDescription, "20", "private"}));
    const auto arrived = platform::Asset::assetWithURL(QUrl::fromLocalFile(upload.filePath));
    EXPECT_EQ(arrived->tracksWithMediaType(platform::MediaType::Video).size(), 1);
    EXPECT_EQ(arrived->tracksWithMediaType(platform::MediaType::Audio).size(), 1);
    EXPECT_NEAR(arrived->duration().seconds(), 10.0, 0.1);

    // The browser saw the sign-in, then the video.
    const QStringList opened = lines("opened.txt");
    ASSERT_EQ(opened.size(), 2);
    EXPECT_TRUE(opened[0].startsWith(server.baseUrl().toString() + "/o/oauth2/v2/auth?"));
    EXPECT_EQ(opened[1], "https://www.youtube.com/watch?v=" + upload.videoId);

    const QImage form(shots + "/publish-form.png"), progress(shots + "/publish-progress.png");
    ASSERT_FALSE(form.isNull() || progress.isNull());
    EXPECT_LT(meanLightness(progress), meanLightness(form) * 0.75)
        << "the progress overlay dims the form";
}

// Publishing as a host sees it: tamsel-edit on a real X server (Xvfb), the
// share button, YouTube in the sheet, the real plug-in against the local fake
// of the service, the browser's sign-in and the desktop's opener played by a
// fake xdg-open on the PATH. The form, the progress overlay and the alert are
// kept as screenshots when TAMSEL_SCREENSHOT_DIR names a folder.

#include "FakeYouTubeServer.h"
#include "MediaGenerator.h"
#include "platform/media/Asset.h"

#include <QColor>
#include <QDir>
#include <QFile>
#include <QImage>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using testing_support::FakeYouTubeServer;

namespace {

const char* kCatalogue = R"(<?xml version="1.0" encoding="UTF-8"?>
<components version="0.14" origin="tamsel-test">
  <component type="desktop-application">
    <id>org.example.Racer</id>
    <name>Racer</name>
    <summary>Races</summary>
    <developer_name>Example Games</developer_name>
  </component>
</components>
)";

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

class PublishEndToEnd : public ::testing::Test {
  protected:
    struct Run {
        int exitCode = -1;
        QByteArray out, err;
        QList<QJsonObject> dumps;
        QByteArray hostReport;
    };

    static void SetUpTestSuite() {
        movies = new QTemporaryDir;
        testmedia::MovieSpec shape;
        shape.seconds = 3;
        QString error;
        ASSERT_TRUE(testmedia::writeMovie(recording(), shape, &error)) << error.toStdString();
    }
    static void TearDownTestSuite() {
        delete movies;
        movies = nullptr;
    }
    static QString recording() { return movies->filePath("recording.mp4"); }

    void SetUp() override {
        for (const char* dir : {"catalogue", "bin", "storage", "mobile", "album"})
            QDir().mkpath(desktop.filePath(dir));
        write("catalogue/racer.xml", kCatalogue);
        // The desktop's opener: notes the address; a sign-in page of the
        // local service is followed as a browser does once the user agrees.
        write("bin/xdg-open", "#!/bin/sh\nprintf '%s\\n' \"$1\" >> '" +
                                  desktop.filePath("opened.txt").toLocal8Bit() +
                                  "'\ncase \"$1\" in http://127.0.0.1:*) curl -s -L -o /dev/null "
                                  "--max-time 60 \"$1\" & ;; esac\n");
        QFile::setPermissions(desktop.filePath("bin/xdg-open"),
                              QFile::ReadOwner | QFile::WriteOwner | QFile::ExeOwner);
        server = std::make_unique<FakeYouTubeServer>(desktop.filePath("storage"));
        ASSERT_TRUE(server->start());
        server->setCategories({{"1", "Film & Animation"},
                               {"10", "Music"},
                               {"20", "Gaming"},
                               {"22", "People & Blogs"}});
    }

    void write(const QString& relative, const QByteArray& content) {
        QFile file(desktop.filePath(relative));
        ASSERT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(content);
    }

    Run publish(const QString& script) {
        write("script.txt", script.toUtf8());
        QProcessEnvironment env = QProcessEnvironment::systemEnvironment();
        for (const QString& line : server->environment())
            env.insert(line.section('=', 0, 0), line.section('=', 1));
        env.insert("PATH", desktop.filePath("bin") + ":/usr/bin:/bin");
        env.insert("QT_QPA_PLATFORM", "xcb");
        env.remove("XDG_CURRENT_DESKTOP");
        env.remove("BROWSER");
        env.remove("DBUS_SESSION_BUS_ADDRESS");
        env.insert("TAMSEL_MOBILE_ROOT", desktop.filePath("mobile"));
        env.insert("TAMSEL_ALBUM_DIR", desktop.filePath("album"));
        env.insert("TAMSEL_AUDIO", "null");
        env.insert("TAMSEL_APPSTREAM_DIRS", desktop.filePath("catalogue"));
        env.insert("TAMSEL_STORE_URL", "");
        env.insert("XDG_DATA_HOME", desktop.filePath("data"));
        env.insert("XDG_DATA_DIRS", desktop.filePath("data-dirs"));
        env.insert("XDG_CONFIG_HOME", desktop.filePath("config"));
        env.insert("XDG_CACHE_HOME", desktop.filePath("cache"));
        env.insert("LANGUAGE", "en");
        env.insert("LC_ALL", "en_US.UTF-8");

        QProcess process;
        process.setProcessEnvironment(env);
        process.start(TAMSEL_XVFB_RUN,
                      {"-a", "-s", "-screen 0 1024x768x24", TAMSEL_EDIT, recording(), "--app-name",
                       "Racer", "--bundle-id", "org.example.Racer", "--automation",
                       desktop.filePath("script.txt")});
        if (!process.waitForFinished(240000))
            process.kill();
        Run run{process.exitCode(),
                process.readAllStandardOutput(),
                process.readAllStandardError(),
                {},
                {}};
        for (const QByteArray& line : run.out.split('\n')) {
            const QJsonDocument json = QJsonDocument::fromJson(line);
            if (json.isObject())
                run.dumps.append(json.object());
            else if (json.isArray())
                run.hostReport = line;
        }
        return run;
    }

    QStringList opened() const {
        QFile file(desktop.filePath("opened.txt"));
        if (!file.open(QIODevice::ReadOnly))
            return {};
        return QString::fromUtf8(file.readAll()).split('\n', Qt::SkipEmptyParts);
    }
    QStringList tempFiles() const {
        return QDir(desktop.filePath("mobile/Library/Tamsel"))
            .entryList(QDir::Files | QDir::Hidden | QDir::NoDotAndDotDot);
    }
    QString screenshotDir() const {
        return qEnvironmentVariableIsEmpty("TAMSEL_SCREENSHOT_DIR")
                   ? desktop.path()
                   : qEnvironmentVariable("TAMSEL_SCREENSHOT_DIR");
    }

    static QTemporaryDir* movies;
    QTemporaryDir desktop;
    std::unique_ptr<FakeYouTubeServer> server;
};

QTemporaryDir* PublishEndToEnd::movies = nullptr;

} // namespace

TEST_F(PublishEndToEnd, PublishedFromTheSheetViewedInTheBrowserAndReportedToTheHost) {
    const QString shots = screenshotDir();
    const Run run = publish(QStringLiteral(R"(wait ready
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
screenshot "%1/publish-alert.png"
press "View on YouTube"
sleep 1
tap doneButton
)")
                                .arg(shots));
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(run.hostReport, R"(["TXPublishToYouTube"])");

    // The form as the activity filled it, then the published video's alert.
    ASSERT_EQ(run.dumps.size(), 2) << run.out.toStdString();
    EXPECT_EQ(run.dumps[0]["publishingDescription"].toString(), kDescription);
    EXPECT_EQ(run.dumps[0]["publishingCategory"].toString(), "20");
    EXPECT_TRUE(run.dumps[0]["alert"].isNull());
    EXPECT_EQ(run.dumps[1]["alert"].toString(), "Your video has been published.");
    EXPECT_DOUBLE_EQ(run.dumps[1]["uploadProgress"].toDouble(), 1.0);

    // What arrived: the recording, whole, with the form's text and category.
    const auto uploads = server->uploads();
    ASSERT_EQ(uploads.size(), 1);
    const auto& upload = uploads[0];
    EXPECT_TRUE(upload.complete);
    EXPECT_EQ(upload.title, "Racer lap");
    EXPECT_EQ(upload.description, kDescription);
    EXPECT_EQ(upload.categoryId, "20");
    EXPECT_EQ(upload.privacyStatus, "private");
    EXPECT_EQ(upload.receivedSize, upload.declaredSize);
    const auto arrived = platform::Asset::assetWithURL(QUrl::fromLocalFile(upload.filePath));
    EXPECT_EQ(arrived->tracksWithMediaType(platform::MediaType::Video).size(), 1);
    EXPECT_EQ(arrived->tracksWithMediaType(platform::MediaType::Audio).size(), 1);
    EXPECT_NEAR(arrived->duration().seconds(), 3.0, 0.1);

    // The browser saw the sign-in, then the video.
    const QStringList addresses = opened();
    ASSERT_EQ(addresses.size(), 2);
    EXPECT_TRUE(addresses[0].startsWith(server->baseUrl().toString() + "/o/oauth2/v2/auth?"));
    EXPECT_EQ(addresses[1], "https://www.youtube.com/watch?v=" + upload.videoId);
    EXPECT_EQ(tempFiles(), QStringList());

    const QImage form(shots + "/publish-form.png");
    const QImage progress(shots + "/publish-progress.png");
    ASSERT_FALSE(form.isNull());
    ASSERT_FALSE(progress.isNull());
    EXPECT_LT(meanLightness(progress), meanLightness(form) * 0.75)
        << "the progress overlay dims the form";
}

TEST_F(PublishEndToEnd, CancelInTheFormReportsNothingAndLeavesNoUploadFile) {
    const Run run = publish(QStringLiteral(R"(wait ready
tap shareButton
share YouTube
wait form
press "Cancel"
sleep 1
tap doneButton
)"));
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(run.hostReport, "[]");
    EXPECT_TRUE(server->uploads().isEmpty());
    EXPECT_EQ(tempFiles(), QStringList());
}

TEST_F(PublishEndToEnd, AFailedUploadIsReportedAsDoneWhenTheAlertIsClosed) {
    FakeYouTubeServer::Faults faults;
    faults.quotaExceeded = 1;
    server->setFaults(faults);
    const Run run = publish(QStringLiteral(R"(wait ready
tap shareButton
share YouTube
wait form
fill title "Racer lap"
press "Publish"
wait alert 120
dump
press "Close"
sleep 1
tap doneButton
)"));
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    ASSERT_EQ(run.dumps.size(), 1);
    EXPECT_EQ(run.dumps[0]["alert"].toString(), "Your video could not be published.");
    EXPECT_EQ(run.hostReport, R"(["TXPublishToYouTube"])");
    EXPECT_EQ(tempFiles(), QStringList());
}

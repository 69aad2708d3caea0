// Sharing as a host sees it: tamsel-edit, the editor's share button, the
// desktop's sheet and its mail activity, with a fake xdg-email on the PATH
// and a test AppStream catalogue; and the sheet on a real X server (Xvfb),
// saved as screenshots of the compact and the wide layout.

#include "editor/EndToEndFixture.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QImage>
#include <QJsonArray>
#include <QProcess>
#include <QStandardPaths>

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

QStringList names(const QJsonValue& array) {
    QStringList out;
    for (const QJsonValue& v : array.toArray())
        out.append(v.toString());
    return out;
}

class ShareEndToEnd : public EndToEnd {
  protected:
    void SetUp() override {
        QDir().mkpath(desktop.filePath("catalogue"));
        QFile catalogue(desktop.filePath("catalogue/racer.xml"));
        ASSERT_TRUE(catalogue.open(QIODevice::WriteOnly));
        catalogue.write(kCatalogue);
        catalogue.close();
        QDir().mkpath(desktop.filePath("bin"));
        script("xdg-mime", "echo fake-mail.desktop\n");
        script("xdg-email", "for a in \"$@\"; do printf '%s\\n' \"$a\"; done > '" +
                                desktop.filePath("xdg-email.args").toLocal8Bit() + "'\n");

        env.insert("PATH", desktop.filePath("bin") + ":/usr/bin:/bin");
        env.insert("TAMSEL_APPSTREAM_DIRS", desktop.filePath("catalogue"));
        env.insert("TAMSEL_STORE_URL", ""); // no remote catalogue: no network in tests
        env.insert("XDG_DATA_HOME", desktop.filePath("data"));
        env.insert("XDG_DATA_DIRS", desktop.filePath("data-dirs"));
        env.insert("XDG_CACHE_HOME", desktop.filePath("cache"));
        env.insert("LANGUAGE", "en");
        env.insert("LC_ALL", "en_US.UTF-8");
    }

    void script(const QString& name, const QByteArray& body) {
        QFile file(desktop.filePath("bin/" + name));
        ASSERT_TRUE(file.open(QIODevice::WriteOnly));
        file.write("#!/bin/sh\n" + body);
        file.close();
        file.setPermissions(file.permissions() | QFile::ExeOwner);
    }

    QStringList mailArguments() const {
        QFile file(desktop.filePath("xdg-email.args"));
        if (!file.open(QIODevice::ReadOnly))
            return {};
        return QString::fromUtf8(file.readAll()).split('\n', Qt::SkipEmptyParts);
    }

    QTemporaryDir desktop;
    QProcessEnvironment env;
};

} // namespace

TEST_F(ShareEndToEnd, MailFromTheSheetReachesTheHost) {
    const QByteArray original = hashOf(recording());
    const Run run = edit(R"(
wait ready
tap shareButton
share org.tamsel.activity.Mail
wait log "MailActivity:" 20
dump
tap doneButton
)",
                         {}, {}, env);
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(run.hostReport, "[\"org.tamsel.activity.Mail\"]") << run.out.toStdString();

    const QStringList args = mailArguments();
    ASSERT_FALSE(args.isEmpty()) << "xdg-email was not run";
    const qsizetype attach = args.indexOf("--attach");
    ASSERT_GE(attach, 0);
    EXPECT_EQ(args[attach + 1], recording()) << "the movie is attached";
    const qsizetype body = args.indexOf("--body");
    ASSERT_GE(body, 0);
    EXPECT_EQ(args[body + 1], "Check out my recording of Racer by Example Games!")
        << "the share text from the test catalogue";
    EXPECT_EQ(args[body + 2], "appstream://org.example.Racer");

    ASSERT_EQ(run.dumps.size(), 1);
    EXPECT_EQ(names(run.dumps[0]["activityTypes"]), QStringList{"org.tamsel.activity.Mail"});
    EXPECT_EQ(names(run.dumps[0]["topToolBar"]).first(), "doneButton");
    EXPECT_EQ(hashOf(recording()), original) << "the host's movie is never modified";
}

TEST_F(ShareEndToEnd, ACancelledSheetAddsNothing) {
    const Run cancelled = edit(R"(
wait ready
tap shareButton
sleep 3
dump
share cancel
dump
tap doneButton
)",
                               {}, {}, env);
    ASSERT_EQ(cancelled.exitCode, 0) << cancelled.err.toStdString();
    EXPECT_EQ(cancelled.hostReport, "[]");
    ASSERT_EQ(cancelled.dumps.size(), 2);
    const QJsonObject sheet = cancelled.dumps[0]["shareSheet"].toObject();
    EXPECT_EQ(names(sheet["activityTypes"]),
              (QStringList{"org.tamsel.activity.Mail", "TXPublishToYouTube",
                           "org.tamsel.activity.SaveToFiles", "org.tamsel.activity.ShowInFolder"}))
        << "no phone, no web link for Facebook, copy excluded, the plug-in built beside";
    EXPECT_EQ(names(sheet["items"]),
              (QStringList{"Check out my recording of Racer by Example Games!",
                           "appstream://org.example.Racer", recording()}));
    EXPECT_TRUE(cancelled.dumps[1]["shareSheet"].isNull());
}

TEST_F(ShareEndToEnd, ScreenshotsOfTheSheetInBothLayouts) {
    const QString xvfb = QStandardPaths::findExecutable("xvfb-run");
    if (xvfb.isEmpty())
        GTEST_SKIP() << "xvfb-run is not installed";
    const QString shots = QCoreApplication::applicationDirPath() + "/share-screenshots";
    QDir().mkpath(shots);
    const QString compact = shots + "/share-sheet-compact.png";
    const QString wide = shots + "/share-sheet-wide.png";
    QFile::remove(compact);
    QFile::remove(wide);

    const auto shoot = [&](const QString& device, int width, int height, const QString& file) {
        const QString scriptPath = mobile.filePath(device + ".txt");
        QFile script(scriptPath);
        script.open(QIODevice::WriteOnly);
        script.write(QStringLiteral("wait ready\nresize %1 %2\nsleep 0.5\ntap shareButton\n"
                                    "sleep 2\nscreenshot %3\nshare cancel\n")
                         .arg(width)
                         .arg(height)
                         .arg(file)
                         .toUtf8());
        script.close();
        QProcess process;
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        for (const QString& key : env.keys())
            environment.insert(key, env.value(key));
        environment.insert("QT_QPA_PLATFORM", "xcb");
        environment.insert("TAMSEL_MOBILE_ROOT", mobile.path());
        environment.insert("TAMSEL_ALBUM_DIR", album.path());
        environment.insert("TAMSEL_AUDIO", "null");
        process.setProcessEnvironment(environment);
        process.setProcessChannelMode(QProcess::MergedChannels);
        process.start(xvfb, {"-a", "-s", "-screen 0 1280x1024x24",
                             QCoreApplication::applicationDirPath() + "/tamsel-edit", recording(),
                             "--app-name", "Racer", "--bundle-id", "org.example.Racer", "--device",
                             device, "--automation", scriptPath});
        EXPECT_TRUE(process.waitForFinished(120000));
        EXPECT_EQ(process.exitCode(), 0) << process.readAll().toStdString();
    };
    shoot("phone", 420, 760, compact);
    shoot("tablet", 1100, 700, wide);

    // Compact: the sheet covers the window, a light card and no video.
    QImage image(compact);
    ASSERT_FALSE(image.isNull());
    int light = 0, all = 0;
    for (int y = 0; y < image.height(); y += 4)
        for (int x = 0; x < image.width(); x += 4, ++all)
            light += qGray(image.pixel(x, y)) > 200;
    EXPECT_GT(light, all * 8 / 10) << "the sheet fills the window";

    // Wide: a light panel near the share item at the top right; the video
    // stays visible on the left.
    image = QImage(wide);
    ASSERT_FALSE(image.isNull());
    EXPECT_GT(qGray(image.pixel(image.width() - 160, 160)), 200) << "the popover";
    EXPECT_LT(qGray(image.pixel(image.width() / 4, image.height() / 2)), 200) << "the video";
}

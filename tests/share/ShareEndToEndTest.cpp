// Sharing as a host sees it: tamsel-edit, the editor's share button, the
// desktop's sheet and its mail activity, with a fake xdg-email on the PATH
// and a test AppStream catalogue; and the sheet on a real X server (Xvfb),
// saved as screenshots of the compact and the wide layout.

#include "ShareDesktop.h"

#include <QCoreApplication>
#include <QDir>
#include <QImage>
#include <QJsonArray>
#include <QStandardPaths>

namespace {

QStringList names(const QJsonValue& array) {
    QStringList out;
    for (const QJsonValue& v : array.toArray())
        out.append(v.toString());
    return out;
}

class ShareEndToEnd : public ShareDesktop {
  protected:
    void SetUp() override {
        ShareDesktop::SetUp();
        program("xdg-mime", "echo fake-mail.desktop\n");
        program("xdg-email", "for a in \"$@\"; do printf '%s\\n' \"$a\"; done > '" +
                                 desktop.filePath("xdg-email.args").toLocal8Bit() + "'\n");
    }
};

} // namespace

// A cancelled sheet adds nothing; a mail from the next one reaches the host.
TEST_F(ShareEndToEnd, MailFromTheSheetReachesTheHostAndACancelledSheetAddsNothing) {
    const QByteArray original = hashOf(recording());
    const Run run = edit(R"(
wait ready
tap shareButton
sleep 3
dump
share cancel
dump
tap shareButton
share org.tamsel.activity.Mail
wait log "MailActivity:" 20
dump
tap doneButton
)",
                         {}, {}, env);
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(run.hostReport, "[\"org.tamsel.activity.Mail\"]") << run.out.toStdString();
    ASSERT_EQ(run.dumps.size(), 3);
    const QJsonObject sheet = run.dumps[0]["shareSheet"].toObject();
    EXPECT_EQ(names(sheet["activityTypes"]),
              (QStringList{"org.tamsel.activity.Mail", "TXPublishToYouTube",
                           "org.tamsel.activity.SaveToFiles", "org.tamsel.activity.ShowInFolder"}))
        << "no phone, no web link for Facebook, copy excluded, the plug-in built beside";
    EXPECT_EQ(names(sheet["items"]),
              (QStringList{"Check out my recording of Racer by Example Games!",
                           "appstream://org.example.Racer", recording()}));
    EXPECT_TRUE(run.dumps[1]["shareSheet"].isNull());
    EXPECT_TRUE(names(run.dumps[1]["activityTypes"]).isEmpty()) << "the cancel added nothing";
    EXPECT_EQ(names(run.dumps[2]["activityTypes"]), QStringList{"org.tamsel.activity.Mail"});
    EXPECT_EQ(names(run.dumps[2]["topToolBar"]).first(), "doneButton");

    const QStringList args = lines("xdg-email.args");
    const qsizetype attach = args.indexOf("--attach");
    ASSERT_GE(attach, 0) << "xdg-email was not run with an attachment";
    EXPECT_EQ(args[attach + 1], recording()) << "the movie is attached";
    const qsizetype body = args.indexOf("--body");
    ASSERT_GE(body, 0);
    EXPECT_EQ(args.mid(body + 1, 2),
              (QStringList{"Check out my recording of Racer by Example Games!",
                           "appstream://org.example.Racer"}))
        << "the share text from the test catalogue";
    EXPECT_EQ(hashOf(recording()), original) << "the host's movie is never modified";
}

// Kept in the build tree's share-screenshots folder.
TEST_F(ShareEndToEnd, ScreenshotsOfTheSheetInBothLayouts) {
    if (QStandardPaths::findExecutable("xvfb-run").isEmpty())
        GTEST_SKIP() << "xvfb-run is not installed";
    const QString shots = QCoreApplication::applicationDirPath() + "/share-screenshots";
    QDir().mkpath(shots);
    const auto shoot = [&](const QString& device, QSize size) {
        const QString file = QString("%1/share-sheet-%2.png").arg(shots, device);
        QFile::remove(file);
        const Run run = editUnderXvfb(QString("wait ready\nresize %1 %2\nsleep 0.5\n"
                                              "tap shareButton\nsleep 2\nscreenshot %3\n"
                                              "share cancel\n")
                                          .arg(size.width())
                                          .arg(size.height())
                                          .arg(file),
                                      QSize(1280, 1024), {"--device", device}, env);
        EXPECT_EQ(run.exitCode, 0) << run.err.toStdString();
        return QImage(file);
    };
    QImage image = shoot("phone", QSize(420, 760));
    // Compact: the sheet covers the window, a light card and no video.
    ASSERT_FALSE(image.isNull());
    int light = 0, all = 0;
    for (int y = 0; y < image.height(); y += 4)
        for (int x = 0; x < image.width(); x += 4, ++all)
            light += qGray(image.pixel(x, y)) > 200;
    EXPECT_GT(light, all * 8 / 10) << "the sheet fills the window";

    // Wide: a light panel near the share item at the top right; the video
    // stays visible on the left.
    image = shoot("tablet", QSize(1100, 700));
    ASSERT_FALSE(image.isNull());
    EXPECT_GT(qGray(image.pixel(image.width() - 160, 160)), 200) << "the popover";
    EXPECT_LT(qGray(image.pixel(image.width() / 4, image.height() / 2)), 200) << "the video";
}

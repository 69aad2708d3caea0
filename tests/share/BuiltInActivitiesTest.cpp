// The built-in activities with their outside programs: xdg-email and
// kdeconnect-cli are fake scripts on a PATH of the test's own; the browser,
// the file manager and the save dialog are fakes behind their services.

#include "ShareFakes.h"
#include "platform/services/ActivityTypes.h"
#include "platform/ui/share/CopyToPasteboardActivity.h"
#include "platform/ui/share/KdeConnectLink.h"
#include "platform/ui/share/MailActivity.h"
#include "platform/ui/share/MessageActivity.h"
#include "platform/ui/share/PostToFacebookActivity.h"
#include "platform/ui/share/SaveToFilesActivity.h"
#include "platform/ui/share/ShowInFolderActivity.h"
#include "platform/ui/share/XdgEmailComposer.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QClipboard>
#include <QFile>
#include <QGuiApplication>
#include <QMimeData>
#include <QTemporaryDir>
#include <QUrlQuery>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

class BuiltInTest : public ::testing::Test {
  protected:
    void SetUp() override {
        movie = dir.filePath("Racer_1700000000.mp4");
        attachment = dir.filePath("level.json");
        testing_support::writeFile(movie, 4096);
        testing_support::writeFile(attachment, 16);
        items = {QStringLiteral("Check out my recording of Racer by Example Games!"),
                 QUrl("https://store.example/apps/org.example.Racer"), QUrl::fromLocalFile(movie),
                 QUrl::fromLocalFile(attachment)};
    }

    // A fake program: records each argument on a line of "<name>.args" and
    // prints `output`, exiting with `code`.
    void program(const QString& name, const QByteArray& output, int code = 0) {
        const QString path = bin.filePath(name);
        QFile script(path);
        ASSERT_TRUE(script.open(QIODevice::WriteOnly));
        script.write("#!/bin/sh\nfor a in \"$@\"; do printf '%s\\n' \"$a\"; done >> '" +
                     bin.filePath(name + ".args").toLocal8Bit() + "'\necho '--' >> '" +
                     bin.filePath(name + ".args").toLocal8Bit() + "'\nprintf '" + output +
                     "'\nexit " + QByteArray::number(code) + "\n");
        script.close();
        script.setPermissions(script.permissions() | QFile::ExeOwner);
    }
    QStringList argsOf(const QString& name) {
        QFile file(bin.filePath(name + ".args"));
        if (!file.open(QIODevice::ReadOnly))
            return {};
        return QString::fromUtf8(file.readAll()).split('\n', Qt::SkipEmptyParts);
    }

    // Runs an activity as the sheet does and waits for its finish.
    std::optional<bool> run(Activity& activity) {
        std::optional<bool> finished;
        activity.setFinishHandler([&](bool completed) { finished = completed; });
        activity.prepareWithActivityItems(items);
        activity.performActivity();
        waitUntil([&] { return finished.has_value(); });
        return finished;
    }

    QTemporaryDir dir, bin;
    testing_support::ScopedEnv path{"PATH", bin.path().toLocal8Bit() + ":/usr/bin:/bin"};
    QString movie, attachment;
    QVariantList items;
};

} // namespace

TEST_F(BuiltInTest, MailIsOfferedOnlyWithAMailHandlerAndAttachesTheFiles) {
    program("xdg-email", "");
    {
        MailActivity withoutHandler;
        waitUntil([] { return false; }, 100);
        EXPECT_FALSE(withoutHandler.canPerformWithActivityItems(items)) << "no xdg-mime";
    }
    program("xdg-mime", "");
    {
        MailActivity noDefault;
        waitUntil([] { return false; }, 300);
        EXPECT_FALSE(noDefault.canPerformWithActivityItems(items)) << "no mailto: handler";
    }
    program("xdg-mime", "thunderbird.desktop\\n");
    MailActivity mail;
    bool told = false;
    QObject::connect(&mail, &Activity::availabilityChanged, [&] { told = true; });
    ASSERT_TRUE(waitUntil([&] { return told; }));
    EXPECT_TRUE(mail.canPerformWithActivityItems(items));
    EXPECT_EQ(argsOf("xdg-mime").mid(argsOf("xdg-mime").lastIndexOf("--") - 3, 3),
              (QStringList{"query", "default", "x-scheme-handler/mailto"}));

    EXPECT_EQ(run(mail), true);
    const QStringList args = argsOf("xdg-email");
    ASSERT_FALSE(args.isEmpty());
    EXPECT_TRUE(args.contains("--utf8"));
    const qsizetype body = args.indexOf("--body");
    ASSERT_GE(body, 0);
    EXPECT_EQ(args[body + 1], "Check out my recording of Racer by Example Games!");
    EXPECT_EQ(args[body + 2], "https://store.example/apps/org.example.Racer")
        << "the body's second line is the link";
    EXPECT_EQ(args.count("--attach"), 2);
    EXPECT_EQ(args[args.indexOf("--attach") + 1], movie);
    EXPECT_EQ(args[args.lastIndexOf("--attach") + 1], attachment);
}

TEST_F(BuiltInTest, AMailProgramThatFailsIsNotACompletedMail) {
    program("xdg-mime", "evolution.desktop\\n");
    program("xdg-email", "", 3);
    MailActivity mail;
    ASSERT_TRUE(waitUntil([&] { return mail.canPerformWithActivityItems(items); }));
    EXPECT_EQ(run(mail), false);
}

TEST_F(BuiltInTest, MessageGoesToTheFirstReachablePhone) {
    program("kdeconnect-cli", "");
    {
        MessageActivity none;
        waitUntil([] { return false; }, 300);
        EXPECT_FALSE(none.canPerformWithActivityItems(items)) << "no reachable device";
    }
    program("kdeconnect-cli", "a1b2c3\\nd4e5f6\\n");
    MessageActivity message;
    ASSERT_TRUE(waitUntil([&] { return message.canPerformWithActivityItems(items); }));
    QFile::remove(bin.filePath("kdeconnect-cli.args"));
    EXPECT_EQ(run(message), true);
    const QString sent = argsOf("kdeconnect-cli").join(' ');
    EXPECT_TRUE(sent.contains("--device a1b2c3 --share " + movie)) << sent.toStdString();
    EXPECT_TRUE(sent.contains("--device a1b2c3 --share " + attachment));
    EXPECT_TRUE(sent.contains("--device a1b2c3 --share-text Check out my recording"));
    EXPECT_FALSE(sent.contains("d4e5f6"));
}

TEST_F(BuiltInTest, CopyPutsFilesInEveryFileManagersFormAndTheTextAsText) {
    CopyToPasteboardActivity copy;
    EXPECT_EQ(copy.activityType(), CopyToPasteboardActivityType);
    EXPECT_EQ(run(copy), true);
    const QMimeData* data = QGuiApplication::clipboard()->mimeData();
    ASSERT_TRUE(data);
    EXPECT_EQ(data->urls(),
              (QList<QUrl>{QUrl::fromLocalFile(movie), QUrl::fromLocalFile(attachment)}));
    EXPECT_EQ(data->data("x-special/gnome-copied-files"),
              "copy\n" + QUrl::fromLocalFile(movie).toEncoded() + "\n" +
                  QUrl::fromLocalFile(attachment).toEncoded());
    EXPECT_EQ(data->data("application/x-kde-cutselection"), "0") << "a copy, not a cut";
    EXPECT_EQ(data->text(), "Check out my recording of Racer by Example Games!\n"
                            "https://store.example/apps/org.example.Racer");
}

TEST_F(BuiltInTest, FacebookTakesTheWebLinkNeverAFile) {
    auto opener = std::make_shared<testing_support::RecordingUrlOpener>();
    auto replaced = UrlOpener::implementation().replace([opener] { return opener; });
    PostToFacebookActivity facebook;
    EXPECT_FALSE(facebook.canPerformWithActivityItems({QStringLiteral("text"),
                                                       QUrl("appstream://org.example.Racer"),
                                                       QUrl::fromLocalFile(movie)}))
        << "a software-centre link is no web link";
    EXPECT_TRUE(facebook.canPerformWithActivityItems({QStringLiteral("https://example.org/x")}))
        << "a link written as text counts";
    EXPECT_EQ(run(facebook), true);
    ASSERT_EQ(opener->opened.size(), 1);
    const QUrl dialog = opener->opened.first();
    EXPECT_EQ(dialog.host(), "www.facebook.com");
    EXPECT_EQ(QUrlQuery(dialog).queryItemValue("u", QUrl::FullyDecoded),
              "https://store.example/apps/org.example.Racer");

    opener->accepts = false;
    EXPECT_EQ(run(facebook), false) << "no browser took it";
}

TEST_F(BuiltInTest, SaveToFilesCopiesTheRecordingWhereTheUserChooses) {
    auto chooser = std::make_shared<testing_support::FakeSaveLocationChooser>();
    auto replaced = SaveLocationChooser::implementation().replace([chooser] { return chooser; });
    QTemporaryDir target;
    chooser->choice = target.filePath("kept.mp4");
    SaveToFilesActivity save;
    EXPECT_EQ(run(save), true);
    EXPECT_TRUE(chooser->suggested.endsWith("/Racer_1700000000.mp4"));
    QFile copy(chooser->choice), original(movie);
    ASSERT_TRUE(copy.open(QIODevice::ReadOnly) && original.open(QIODevice::ReadOnly));
    EXPECT_EQ(copy.readAll(), original.readAll());
    EXPECT_EQ(QDir(target.path()).entryList(QDir::Files), QStringList{"kept.mp4"})
        << "no temporary file left behind";

    chooser->choice = movie;
    EXPECT_EQ(run(save), false) << "the recording is never written over";
    EXPECT_EQ(QFileInfo(movie).size(), 4096);
    chooser->choice.clear();
    EXPECT_EQ(run(save), false) << "a cancelled dialog";
}

TEST_F(BuiltInTest, ShowInFolderAsksTheFileManagerElseOpensTheFolder) {
    auto files = std::make_shared<testing_support::FakeFileManager>();
    auto opener = std::make_shared<testing_support::RecordingUrlOpener>();
    auto r1 = FileManagerService::implementation().replace([files] { return files; });
    auto r2 = UrlOpener::implementation().replace([opener] { return opener; });
    ShowInFolderActivity show;
    EXPECT_FALSE(show.canPerformWithActivityItems({QStringLiteral("only text")}));
    EXPECT_EQ(run(show), true);
    ASSERT_EQ(files->shown.size(), 1);
    EXPECT_EQ(files->shown.first(), QList<QUrl>{QUrl::fromLocalFile(movie)});
    EXPECT_TRUE(opener->opened.isEmpty());

    files->answers = false;
    EXPECT_EQ(run(show), true);
    EXPECT_EQ(opener->opened, QList<QUrl>{QUrl::fromLocalFile(dir.path())});
}

// The built-in activities with their outside programs: xdg-email and
// kdeconnect-cli are fake scripts on a PATH of the test's own; the browser,
// the file manager and the save dialog are fakes behind their services.

#include "ShareFakes.h"
#include "platform/services/ActivityTypes.h"
#include "platform/ui/share/CopyToPasteboardActivity.h"
#include "platform/ui/share/MailActivity.h"
#include "platform/ui/share/MessageActivity.h"
#include "platform/ui/share/PostToFacebookActivity.h"
#include "platform/ui/share/SaveToFilesActivity.h"
#include "platform/ui/share/ShowInFolderActivity.h"
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
using namespace testing_support;

namespace {

class BuiltInTest : public ::testing::Test {
  protected:
    void SetUp() override {
        writeFile(movie, 4096);
        writeFile(attachment, 16);
    }

    // A fake program: appends each argument as a line to "<name>.args", then
    // "--"; prints `output` and exits with `code`.
    void program(const QString& name, const QByteArray& output, int code = 0) {
        const QByteArray args = bin.filePath(name + ".args").toLocal8Bit();
        writeText(bin.filePath(name),
                  "#!/bin/sh\nfor a in \"$@\"; do printf '%s\\n' \"$a\"; done >> '" + args +
                      "'\necho -- >> '" + args + "'\nprintf '" + output + "'\nexit " +
                      QByteArray::number(code) + "\n",
                  true);
    }
    QStringList argsOf(const QString& name) {
        QFile file(bin.filePath(name + ".args"));
        file.open(QIODevice::ReadOnly);
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
    ScopedEnv path{"PATH", bin.path().toLocal8Bit() + ":/usr/bin:/bin"};
    QString movie = dir.filePath("Racer_1700000000.mp4"), attachment = dir.filePath("level.json");
    QVariantList items{QStringLiteral("Check out my recording of Racer by Example Games!"),
                       QUrl("https://store.example/apps/org.example.Racer"),
                       QUrl::fromLocalFile(movie), QUrl::fromLocalFile(attachment)};
};

} // namespace

TEST_F(BuiltInTest, MailIsOfferedOnlyWithAMailHandlerAndAttachesTheFiles) {
    program("xdg-email", "");
    for (const bool withXdgMime : {false, true}) {
        if (withXdgMime)
            program("xdg-mime", ""); // no mailto: handler
        MailActivity mail;
        waitUntil([] { return false; }, 300);
        EXPECT_FALSE(mail.canPerformWithActivityItems(items)) << withXdgMime;
    }
    program("xdg-mime", "thunderbird.desktop\\n");
    MailActivity mail;
    bool told = false;
    QObject::connect(&mail, &Activity::availabilityChanged, [&] { told = true; });
    ASSERT_TRUE(waitUntil([&] { return told; }));
    EXPECT_TRUE(mail.canPerformWithActivityItems(items));
    const QStringList asked = argsOf("xdg-mime");
    EXPECT_EQ(asked.mid(asked.size() - 4, 3),
              (QStringList{"query", "default", "x-scheme-handler/mailto"}));

    EXPECT_EQ(run(mail), true);
    // The body and the movie's attachment are checked end to end.
    const QStringList args = argsOf("xdg-email");
    EXPECT_TRUE(args.contains("--utf8"));
    EXPECT_EQ(args.count("--attach"), 2);
    EXPECT_EQ(args[args.indexOf("--attach") + 1], movie);
    EXPECT_EQ(args[args.lastIndexOf("--attach") + 1], attachment);

    program("xdg-email", "", 3);
    EXPECT_EQ(run(mail), false) << "a mail program that fails is not a completed mail";
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
    FakeBrowser browser;
    PostToFacebookActivity facebook;
    EXPECT_FALSE(facebook.canPerformWithActivityItems({QStringLiteral("text"),
                                                       QUrl("appstream://org.example.Racer"),
                                                       QUrl::fromLocalFile(movie)}))
        << "a software-centre link is no web link";
    EXPECT_TRUE(facebook.canPerformWithActivityItems({QStringLiteral("https://example.org/x")}))
        << "a link written as text counts";
    EXPECT_EQ(run(facebook), true);
    ASSERT_EQ(browser.opened().size(), 1);
    const QUrl dialog = browser.opened().first();
    EXPECT_EQ(dialog.host(), "www.facebook.com");
    EXPECT_EQ(QUrlQuery(dialog).queryItemValue("u", QUrl::FullyDecoded),
              "https://store.example/apps/org.example.Racer");

    browser.setBehaviour(FakeBrowser::Behaviour::Refuse);
    EXPECT_EQ(run(facebook), false) << "no browser took it";
}

TEST_F(BuiltInTest, SaveToFilesCopiesTheRecordingWhereTheUserChooses) {
    InPlace<SaveLocationChooser, FakeSaveLocationChooser> chooser;
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
    InPlace<FileManagerService, FakeFileManager> files;
    FakeBrowser opener;
    ShowInFolderActivity show;
    EXPECT_FALSE(show.canPerformWithActivityItems({QStringLiteral("only text")}));
    EXPECT_EQ(run(show), true);
    EXPECT_EQ(files->shown, QList<QUrl>{QUrl::fromLocalFile(movie)});
    EXPECT_TRUE(opener.opened().isEmpty());

    files->answers = false;
    EXPECT_EQ(run(show), true);
    EXPECT_EQ(opener.opened(), QList<QUrl>{QUrl::fromLocalFile(dir.path())});
}

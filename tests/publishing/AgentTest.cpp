// The publishing agent and its form, on fakes of the sign-in and the upload
// client: what it tells its delegate, what it sends, and what the form shows.

#include "CategoryPicker.h"
#include "FakePublishingServices.h"
#include "FormTextCell.h"
#include "MediaFileWaiter.h"
#include "ShareFakes.h"
#include "YouTubePublishingAgent.h"
#include "YouTubeUploadForm.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include "platform/runtime/MainQueue.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"

#include <QFile>
#include <QLineEdit>
#include <QTest>
#include <gtest/gtest.h>

using namespace testing_support;
namespace PublishingError = platform::PublishingError;

namespace {

struct RecordingDelegate : platform::PublishingAgentDelegate {
    QStringList calls;
    platform::ErrorPtr endError;
    void publishingAgentWillBeDisplayed(platform::PublishingAgent*) override {
        calls << "willBeDisplayed";
    }
    void publishingAgentDoneButtonClicked(platform::PublishingAgent*) override { calls << "done"; }
    void publishingAgentCancelButtonClicked(platform::PublishingAgent*) override {
        calls << "cancel";
    }
    void publishingAgentDidBeginPublishing(platform::PublishingAgent*) override {
        calls << "didBegin";
    }
    void publishingAgentDidEndPublishing_error(platform::PublishingAgent*,
                                               platform::ErrorPtr error) override {
        calls << "didEnd";
        endError = error;
    }
};

class AgentTest : public ::testing::Test {
  protected:
    // The agent, handed the upload file's device path, shown in a window
    // once its categories are in, with `title` typed; the file is written
    // unless `withFile` is false.
    void show(const QString& title = QStringLiteral("Run"), bool withFile = true) {
        mobile_.makeLibrary();
        if (withFile)
            writeFile(hostPath_, 4096);
        agent_->setDelegate(delegate_);
        agent_->setMediaPath(QStringLiteral("/private/var/mobile/Library/Tamsel//") +
                             QFileInfo(hostPath_).fileName());
        agent_->mediaWaiter()->setPollInterval(20);
        window_ = std::make_unique<platform::Window>();
        window_->resize(540, 620);
        window_->setRootViewController(agent_->navigationController());
        window_->show();
        ASSERT_TRUE(waitUntil([&] { return !form()->categories().isEmpty(); }));
        form()->titleCell()->setValue(title);
    }
    void TearDown() override {
        window_.reset();
        agent_.reset();
        platform::MainQueue::runPending();
    }

    YouTubeUploadForm* form() const { return agent_->form(); }
    void publish() { form()->publishItem()->trigger(); }
    bool uploaded() {
        return waitUntil([&] { return !client_->uploads.isEmpty(); });
    }

    MobileRoot mobile_;
    QString hostPath_ = mobile_.hostPath(QStringLiteral("Library/Tamsel/TXCapture_YouTube1.mp4"));
    InPlace<platform::YouTubeSignIn, FakeSignIn> signIn_;
    InPlace<platform::YouTubeUploadClient, FakeUploadClient> client_;
    std::shared_ptr<RecordingDelegate> delegate_ = std::make_shared<RecordingDelegate>();
    std::shared_ptr<YouTubePublishingAgent> agent_ = std::make_shared<YouTubePublishingAgent>();
    std::unique_ptr<platform::Window> window_;
};

} // namespace

TEST_F(AgentTest, PublishingTellsTheDelegateInOrderAndEndsWithTheWatchAddress) {
    signIn_->signedIn = true;
    show(QStringLiteral("Racer run"));
    EXPECT_EQ(delegate_->calls, QStringList{"willBeDisplayed"});
    form()->descriptionCell()->setValue(QStringLiteral("T L"));
    form()->setPrivacyStatus(QStringLiteral("unlisted"));
    publish();
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "done", "didBegin"}));
    ASSERT_TRUE(uploaded());
    const platform::YouTubeUpload sent = client_->uploads.first();
    EXPECT_EQ(sent.filePath, hostPath_) << "the device path, mapped onto this machine";
    EXPECT_EQ(QStringList({sent.title, sent.description, sent.privacyStatus, sent.categoryId}),
              QStringList({"Racer run", "T L", "unlisted", "22"}))
        << "22: the form's own default category";

    client_->progress(40, 100);
    EXPECT_DOUBLE_EQ(form()->uploadProgress(), 0.4);
    EXPECT_TRUE(form()->statusText().contains(QStringLiteral("40%")));
    EXPECT_FALSE(form()->publishItem()->isEnabled());
    EXPECT_FALSE(form()->cancelItem()->isEnabled());
    client_->succeed(QStringLiteral("abc123"));
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "done", "didBegin", "didEnd"}));
    EXPECT_EQ(delegate_->endError, nullptr);
    EXPECT_EQ(agent_->mediaURL(), "https://www.youtube.com/watch?v=abc123");
    EXPECT_DOUBLE_EQ(form()->uploadProgress(), 1.0);
    EXPECT_EQ(form()->phase(), YouTubeUploadForm::Phase::Published);
}

TEST_F(AgentTest, PublishNeedsATitleAndReturnInTheTitlePublishes) {
    signIn_->signedIn = true;
    show(QStringLiteral("  \n "));
    auto* field = qobject_cast<QLineEdit*>(form()->titleCell()->editor());
    EXPECT_FALSE(form()->publishItem()->isEnabled());
    publish();
    QTest::keyClick(field, Qt::Key_Return);
    EXPECT_EQ(delegate_->calls, QStringList{"willBeDisplayed"});
    form()->titleCell()->setValue(QStringLiteral("Run"));
    EXPECT_TRUE(form()->publishItem()->isEnabled());
    QTest::keyClick(field, Qt::Key_Return);
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "done", "didBegin"}));
}

// Each way publishing can fail ends it once, with the error in the form and
// no watch address.
TEST_F(AgentTest, AFailureEndsPublishingOnceAndTheFormSaysWhy) {
    const struct {
        const char* what;
        bool signedIn, withFile;
        PublishingError::Code code;
        QString shown;
    } cases[] = {
        {"a refused sign-in", false, true, PublishingError::SignInCancelled, "cancelled"},
        {"an export that never finishes", true, false, PublishingError::MediaNotReady, ""},
        {"a failed upload", true, true, PublishingError::QuotaExceeded, "quota is used up"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        window_.reset();
        delegate_->calls.clear();
        agent_ = std::make_shared<YouTubePublishingAgent>();
        signIn_->signedIn = c.signedIn;
        signIn_->signInAnswer =
            PublishingError::make(PublishingError::SignInCancelled, "Signing in was cancelled");
        QFile::remove(hostPath_);
        show(QStringLiteral("Run"), c.withFile);
        agent_->mediaWaiter()->setStallTimeout(300);
        publish();
        if (c.code == PublishingError::QuotaExceeded) {
            ASSERT_TRUE(uploaded());
            client_->fail(c.code, c.shown);
        }
        ASSERT_TRUE(waitUntil([&] { return delegate_->calls.contains("didEnd"); }, 5000));
        EXPECT_TRUE(PublishingError::is(delegate_->endError, c.code));
        EXPECT_EQ(delegate_->calls.count("didEnd"), 1);
        EXPECT_EQ(form()->phase(), YouTubeUploadForm::Phase::Failed);
        EXPECT_TRUE(form()->statusText().contains(c.shown));
        EXPECT_TRUE(agent_->mediaURL().isEmpty());
        client_->uploads.clear();
    }
    EXPECT_EQ(signIn_->signInCalls, 1) << "without an account, publishing signs in first";
}

// The activity hands over the path while its export still writes: nothing is
// sent until the file has been renamed into place.
TEST_F(AgentTest, WaitsForTheExportToFinishBeforeSendingAByte) {
    signIn_->signedIn = true;
    show(QStringLiteral("Run"), false);
    const QString partial =
        mobile_.hostPath(QStringLiteral("Library/Tamsel/.TXCapture_YouTube1.mp4.0123abcd.part"));
    writeFile(partial, 100);
    agent_->mediaWaiter()->setStallTimeout(2000);
    publish();
    for (int i = 0; i < 5; ++i) {
        waitUntil([] { return false; }, 100);
        writeFile(partial, 200 + i * 100); // the export goes on
    }
    EXPECT_TRUE(client_->uploads.isEmpty());
    EXPECT_FALSE(delegate_->calls.contains("didEnd"));
    ASSERT_TRUE(QFile::rename(partial, hostPath_));
    ASSERT_TRUE(uploaded());
}

TEST_F(AgentTest, TitleAndDescriptionAreMadeFitAndTheFormSaysWhatChanged) {
    signIn_->signedIn = true;
    show(QStringLiteral("<b>") + QString(120, QLatin1Char('x')));
    EXPECT_TRUE(form()->adjustmentNotice().contains(QStringLiteral("will be shortened")));
    publish();
    ASSERT_TRUE(uploaded());
    // How the text is fitted is VideoMetadataTest's; here, that it is.
    const QString sent = client_->uploads.first().title;
    EXPECT_EQ(sent.size(), 100);
    EXPECT_EQ(form()->titleCell()->value(), sent) << "the field shows what was sent";
    EXPECT_TRUE(form()->adjustmentNotice().contains(QStringLiteral("was shortened")));
    EXPECT_TRUE(form()->adjustmentNotice().contains(QStringLiteral("were replaced")));
}

// The service's categories follow the built-in ones; the choice made so far
// stays. (The activity's preselection, run through the form's method table,
// is checked end to end: the form comes up on category "20".)
TEST_F(AgentTest, ANewListOfCategoriesKeepsTheChoiceMadeSoFar) {
    signIn_->signedIn = true;
    show();
    auto* picker = qobject_cast<youtube_publishing::CategoryPicker*>(form()->picker());
    ASSERT_GE(picker->findText("Gaming"), 0);
    picker->setCurrentIndex(picker->findText("Gaming")); // the user's choice
    form()->setCategories({{"24", "Entertainment"}, {"20", "Gaming"}, {"22", "People & Blogs"}});
    EXPECT_EQ(form()->defaultCategory(), "20");
    EXPECT_EQ(picker->currentText(), "Gaming");
}

TEST_F(AgentTest, WithoutAnOAuthClientTheAccountRowSaysSoAndCancelStillLeaves) {
    signIn_->configured = false;
    show();
    EXPECT_EQ(form()->accountCell()->state(),
              youtube_publishing::FormAccountCell::State::Unavailable);
    form()->cancelItem()->trigger();
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "cancel"}));
}

#include "CategoryPicker.h"
#include "FakePublishingServices.h"
#include "FormTextCell.h"
#include "MediaFileWaiter.h"
#include "YouTubePublishingAgent.h"
#include "YouTubeUploadForm.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include "platform/runtime/MainQueue.h"
#include "platform/runtime/MethodTable.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"

#include <QFile>
#include <QLineEdit>
#include <QStringList>
#include <QTest>
#include <gtest/gtest.h>

using namespace testing_support;
namespace PublishingError = platform::PublishingError;

namespace {

class RecordingDelegate : public platform::PublishingAgentDelegate {
  public:
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

// Stands in for the activity whose preselection is exchanged into the form.
class Preselector : public QObject {
    Q_OBJECT
};

class AgentTest : public ::testing::Test {
  protected:
    void SetUp() override {
        mobile_.makeLibrary();
        mediaPath_ = QStringLiteral("/private/var/mobile/Library/Tamsel//TXCapture_YouTube1.mp4");
        hostPath_ = mobile_.hostPath(QStringLiteral("Library/Tamsel/TXCapture_YouTube1.mp4"));
        agent_ = std::make_shared<YouTubePublishingAgent>();
        agent_->setDelegate(delegate_);
        agent_->setMediaPath(mediaPath_);
        agent_->mediaWaiter()->setPollInterval(20);
    }
    void TearDown() override {
        window_.reset();
        agent_.reset();
        platform::MainQueue::runPending();
    }

    void show() {
        window_ = std::make_unique<platform::Window>();
        window_->resize(540, 620);
        window_->setRootViewController(agent_->navigationController());
        window_->show();
        ASSERT_TRUE(waitUntil([&] { return !form()->categories().isEmpty(); }));
    }

    YouTubeUploadForm* form() const { return agent_->form(); }
    void publish() { form()->publishItem()->trigger(); }

    MobileRoot mobile_;
    ScopedFakeServices services_;
    std::shared_ptr<RecordingDelegate> delegate_ = std::make_shared<RecordingDelegate>();
    std::shared_ptr<YouTubePublishingAgent> agent_;
    std::unique_ptr<platform::Window> window_;
    QString mediaPath_;
    QString hostPath_;
};

} // namespace

TEST_F(AgentTest, PublishingTellsTheDelegateInOrderAndEndsWithTheWatchAddress) {
    services_.signIn->signedIn = true;
    writeFile(hostPath_, 4096);
    show();
    EXPECT_EQ(delegate_->calls, QStringList{"willBeDisplayed"});
    form()->titleCell()->setValue(QStringLiteral("Racer run"));
    form()->descriptionCell()->setValue(QStringLiteral("T L"));
    form()->setPrivacyStatus(QStringLiteral("unlisted"));
    publish();
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "done", "didBegin"}));
    ASSERT_TRUE(waitUntil([&] { return !services_.client->uploads.isEmpty(); }));
    const platform::YouTubeUpload sent = services_.client->uploads.first();
    EXPECT_EQ(sent.filePath, hostPath_) << "the device path, mapped onto this machine";
    EXPECT_EQ(sent.title, "Racer run");
    EXPECT_EQ(sent.description, "T L");
    EXPECT_EQ(sent.privacyStatus, "unlisted");
    EXPECT_EQ(sent.categoryId, "22") << "the form's own default";

    services_.client->progress(40, 100);
    EXPECT_DOUBLE_EQ(form()->uploadProgress(), 0.4);
    EXPECT_TRUE(form()->statusText().contains(QStringLiteral("40%")));
    EXPECT_FALSE(form()->publishItem()->isEnabled());
    EXPECT_FALSE(form()->cancelItem()->isEnabled());
    services_.client->succeed(QStringLiteral("abc123"));
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "done", "didBegin", "didEnd"}));
    EXPECT_EQ(delegate_->endError, nullptr);
    EXPECT_EQ(agent_->mediaURL(), "https://www.youtube.com/watch?v=abc123");
    EXPECT_DOUBLE_EQ(form()->uploadProgress(), 1.0);
    EXPECT_EQ(form()->phase(), YouTubeUploadForm::Phase::Published);
}

TEST_F(AgentTest, CancelIsReportedAndNothingIsSent) {
    show();
    form()->cancelItem()->trigger();
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "cancel"}));
    EXPECT_TRUE(services_.client->uploads.isEmpty());
}

TEST_F(AgentTest, PublishNeedsATitleAndReturnInTheTitlePublishes) {
    services_.signIn->signedIn = true;
    show();
    auto* field = qobject_cast<QLineEdit*>(form()->titleCell()->editor());
    form()->titleCell()->setValue(QStringLiteral("  \n "));
    EXPECT_FALSE(form()->publishItem()->isEnabled());
    publish();
    QTest::keyClick(field, Qt::Key_Return);
    EXPECT_EQ(delegate_->calls, QStringList{"willBeDisplayed"});
    form()->titleCell()->setValue(QStringLiteral("Run"));
    EXPECT_TRUE(form()->publishItem()->isEnabled());
    QTest::keyClick(field, Qt::Key_Return);
    EXPECT_EQ(delegate_->calls, (QStringList{"willBeDisplayed", "done", "didBegin"}));
}

TEST_F(AgentTest, WithoutAnAccountPublishSignsInFirstAndAFailedSignInEndsPublishing) {
    writeFile(hostPath_, 10);
    show();
    form()->titleCell()->setValue(QStringLiteral("Run"));
    services_.signIn->signInAnswer = PublishingError::make(
        PublishingError::SignInCancelled, QStringLiteral("Signing in was cancelled"));
    publish();
    ASSERT_TRUE(waitUntil([&] { return delegate_->calls.contains("didEnd"); }));
    EXPECT_EQ(services_.signIn->signInCalls, 1);
    EXPECT_TRUE(PublishingError::is(delegate_->endError, PublishingError::SignInCancelled));
    EXPECT_TRUE(services_.client->uploads.isEmpty());
    EXPECT_EQ(form()->phase(), YouTubeUploadForm::Phase::Failed);
    EXPECT_TRUE(form()->statusText().contains(QStringLiteral("cancelled")));
}

TEST_F(AgentTest, WithoutAnAccountPublishSignsInThenUploads) {
    writeFile(hostPath_, 10);
    show();
    form()->titleCell()->setValue(QStringLiteral("Run"));
    publish();
    ASSERT_TRUE(waitUntil([&] { return !services_.client->uploads.isEmpty(); }));
    EXPECT_EQ(services_.signIn->signInCalls, 1);
}

// The activity hands over the path while its export still writes: nothing is
// sent until the file has been renamed into place.
TEST_F(AgentTest, WaitsForTheExportToFinishBeforeSendingAByte) {
    services_.signIn->signedIn = true;
    show();
    const QString partial =
        mobile_.hostPath(QStringLiteral("Library/Tamsel/.TXCapture_YouTube1.mp4.0123abcd.part"));
    writeFile(partial, 100);
    form()->titleCell()->setValue(QStringLiteral("Run"));
    agent_->mediaWaiter()->setStallTimeout(2000);
    publish();
    for (int i = 0; i < 5; ++i) {
        waitUntil([] { return false; }, 100);
        writeFile(partial, 200 + i * 100); // the export goes on
    }
    EXPECT_TRUE(services_.client->uploads.isEmpty());
    EXPECT_FALSE(delegate_->calls.contains("didEnd"));
    ASSERT_TRUE(QFile::rename(partial, hostPath_));
    ASSERT_TRUE(waitUntil([&] { return !services_.client->uploads.isEmpty(); }));
}

TEST_F(AgentTest, AnExportThatNeverFinishesFailsPublishingCleanly) {
    services_.signIn->signedIn = true;
    show();
    form()->titleCell()->setValue(QStringLiteral("Run"));
    agent_->mediaWaiter()->setStallTimeout(300);
    publish();
    ASSERT_TRUE(waitUntil([&] { return delegate_->calls.contains("didEnd"); }, 5000));
    EXPECT_TRUE(PublishingError::is(delegate_->endError, PublishingError::MediaNotReady));
    EXPECT_TRUE(services_.client->uploads.isEmpty());
    EXPECT_TRUE(agent_->mediaURL().isEmpty());
}

TEST_F(AgentTest, AFailedUploadEndsWithItsErrorShownInTheForm) {
    services_.signIn->signedIn = true;
    writeFile(hostPath_, 10);
    show();
    form()->titleCell()->setValue(QStringLiteral("Run"));
    publish();
    ASSERT_TRUE(waitUntil([&] { return !services_.client->uploads.isEmpty(); }));
    services_.client->fail(PublishingError::QuotaExceeded, QStringLiteral("quota is used up"));
    EXPECT_TRUE(PublishingError::is(delegate_->endError, PublishingError::QuotaExceeded));
    EXPECT_TRUE(form()->statusText().contains(QStringLiteral("quota is used up")));
    EXPECT_TRUE(agent_->mediaURL().isEmpty());
    EXPECT_EQ(delegate_->calls.count("didEnd"), 1);
}

TEST_F(AgentTest, TitleAndDescriptionAreMadeFitAndTheFormSaysWhatChanged) {
    services_.signIn->signedIn = true;
    writeFile(hostPath_, 10);
    show();
    form()->titleCell()->setValue(QStringLiteral("<b>") + QString(120, QLatin1Char('x')));
    EXPECT_TRUE(form()->adjustmentNotice().contains(QStringLiteral("will be shortened")));
    publish();
    ASSERT_TRUE(waitUntil([&] { return !services_.client->uploads.isEmpty(); }));
    const QString sent = services_.client->uploads.first().title;
    EXPECT_EQ(sent.size(), 100);
    EXPECT_TRUE(sent.startsWith(QStringLiteral("‹b›")));
    EXPECT_EQ(form()->titleCell()->value(), sent) << "the field shows what was sent";
    EXPECT_TRUE(form()->adjustmentNotice().contains(QStringLiteral("was shortened")));
    EXPECT_TRUE(form()->adjustmentNotice().contains(QStringLiteral("were replaced")));
}

// Categories arrive twice, built-in then the service's; the operation runs
// each time, through the method table, so an activity's version takes over.
TEST_F(AgentTest, CategoriesArriveBuiltInThenFromTheServiceAndRunTheReplaceableOperation) {
    services_.signIn->signedIn = true;
    services_.client->categories = {{"10", "Music"}, {"20", "Gaming"}, {"22", "People & Blogs"}};
    const QByteArray operation = YouTubeUploadForm::selectCategoryOperation();
    int runs = 0;
    platform::MethodTable::addMethod(&Preselector::staticMetaObject, operation,
                                     [&](QObject* form, const QVariantList&) {
                                         ++runs;
                                         form->setProperty("_defaultCategory", "20");
                                         return QVariant();
                                     });
    ASSERT_TRUE(platform::MethodTable::exchangeImplementations(
        &YouTubeUploadForm::staticMetaObject, &Preselector::staticMetaObject, operation));
    show();
    ASSERT_TRUE(waitUntil([&] { return form()->categories().size() == 3; }));
    EXPECT_EQ(runs, 2);
    EXPECT_EQ(form()->defaultCategory(), "20");
    EXPECT_EQ(form()->property("_picker").value<QObject*>()->property("selectedRow").toInt(), 1);
    ASSERT_TRUE(platform::MethodTable::exchangeImplementations(
        &YouTubeUploadForm::staticMetaObject, &Preselector::staticMetaObject, operation));
}

TEST_F(AgentTest, TheFormsOwnPreselectionKeepsTheChoiceMadeSoFar) {
    services_.signIn->signedIn = true;
    services_.client->categories = {{"10", "Music"}, {"22", "People & Blogs"}, {"23", "Comedy"}};
    show();
    ASSERT_TRUE(waitUntil([&] { return form()->categories().size() == 3; }));
    EXPECT_EQ(form()->defaultCategory(), "22");
    auto* picker = qobject_cast<youtube_publishing::CategoryPicker*>(form()->picker());
    picker->setCurrentIndex(2); // the user picks Comedy
    EXPECT_EQ(form()->defaultCategory(), "23");
    form()->setCategories({{"23", "Comedy"}, {"24", "Entertainment"}});
    EXPECT_EQ(form()->defaultCategory(), "23");
    EXPECT_EQ(picker->currentText(), "Comedy");
}

TEST_F(AgentTest, WithoutAnOAuthClientTheAccountRowSaysPublishingIsNotSetUp) {
    services_.signIn->configured = false;
    show();
    EXPECT_EQ(form()->accountCell()->state(),
              youtube_publishing::FormAccountCell::State::Unavailable);
}

#include "AgentTest.moc"

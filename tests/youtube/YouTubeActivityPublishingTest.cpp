// The activity from the agent's side: cancel, publishing under the progress
// overlay, and the alert whose buttons finish the activity.

#include "ActivityFixture.h"
#include "platform/runtime/Error.h"
#include "platform/ui/Alert.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"
#include "support/Wait.h"

#include <QFile>
#include <QLineEdit>
#include <QPushButton>
#include <QTest>

using namespace platform;
using testing_support::waitUntil;

namespace {

const QString kWatchURL = QStringLiteral("https://www.youtube.com/watch?v=dQw4w9WgXcQ");

// The sheet presents the agent's stack in the window; the upload file exists.
class PublishingFixture : public ActivityFixture {
  protected:
    void SetUp() override {
        window.setRootViewController(pick());
        window.resize(480, 640);
        window.show();
        window.activateWindow();
        ASSERT_TRUE(QTest::qWaitForWindowActive(&window));
        agent = FakePublishingAgent::last();
        ASSERT_TRUE(agent);
        testing_support::writeFile(movieHostPath(), 4096);
        ASSERT_TRUE(QFile::exists(movieHostPath()));
    }

    Alert* alert() const {
        return qobject_cast<Alert*>(agent->navigationController()->presentedViewController());
    }
    QStringList actionTitles() const {
        QStringList titles;
        for (const auto& action : alert()->actions())
            titles.append(action->title());
        return titles;
    }
    // A press on the alert's button with that title, as the user makes it.
    void press(const QString& title) {
        for (const auto& action : alert()->actions())
            if (action->title() == title) {
                QPushButton* button = alert()->buttonForAction(action.get());
                ASSERT_TRUE(button);
                QTest::mouseClick(button, Qt::LeftButton);
                return;
            }
        FAIL() << "no action " << title.toStdString();
    }
    bool uploadFileRemoved() const {
        return waitUntil([&] { return !QFile::exists(movieHostPath()); });
    }

    Window window;
    FakePublishingAgent* agent = nullptr;
};

} // namespace

TEST_F(PublishingFixture, CancelFinishesAsNotCompletedAndRemovesTheUploadFile) {
    agent->pressCancel();
    EXPECT_EQ(finished, false);
    EXPECT_TRUE(uploadFileRemoved());
    // An export still writing the file is stopped, so nothing comes back.
    EXPECT_EQ(exports.made.last()->cancels, 1);
    EXPECT_FALSE(alert());
}

TEST_F(PublishingFixture, PublishEndsEditingAndCoversTheAgentsScreenWithTheOverlay) {
    auto* field = new QLineEdit(agent->form()->view());
    field->show();
    QString committed;
    QObject::connect(field, &QLineEdit::editingFinished, [&] { committed = field->text(); });
    field->setFocus();
    QTest::keyClicks(field, "My run");
    ASSERT_EQ(window.focusWidget(), field);

    agent->pressPublish();
    EXPECT_NE(window.focusWidget(), field);
    EXPECT_EQ(committed, "My run");

    View* screen = agent->navigationController()->view();
    ASSERT_TRUE(activity->progressOverlay);
    EXPECT_EQ(activity->progressOverlay->superview(), screen);
    EXPECT_EQ(activity->progressOverlay->frame(), screen->bounds());
    EXPECT_TRUE(activity->progressOverlay->isShowing());
    EXPECT_TRUE(waitUntil([&] { return activity->progressOverlay->activityIndicator(); }));
    EXPECT_FALSE(finished);
}

TEST_F(PublishingFixture, AfterSuccessViewFinishesAsCompletedAndOpensTheVideo) {
    agent->pressPublish();
    ASSERT_TRUE(waitUntil([&] { return activity->progressOverlay->activityIndicator(); }));
    agent->endPublishing(nullptr, kWatchURL);

    ASSERT_TRUE(alert());
    EXPECT_EQ(alert()->title(), "Your video has been published.");
    EXPECT_EQ(alert()->message(), "");
    EXPECT_EQ(alert()->preferredStyle(), Alert::Style::Alert);
    EXPECT_EQ(actionTitles(), (QStringList{"View on YouTube", "Close"}));
    EXPECT_EQ(alert()->actions()[0]->style(), AlertAction::Style::Default);
    EXPECT_EQ(alert()->actions()[1]->style(), AlertAction::Style::Cancel);
    // The spinner stops; the dimming stays under the alert.
    EXPECT_NE(activity->progressOverlay->activityIndicator()->parentWidget(),
              activity->progressOverlay.get());
    EXPECT_TRUE(activity->progressOverlay->superview());
    // The file goes while the alert is still up.
    EXPECT_TRUE(uploadFileRemoved());
    EXPECT_FALSE(finished);

    press("View on YouTube");
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_EQ(finished, true);
    EXPECT_EQ(opener.opened(), QList<QUrl>{QUrl(kWatchURL)});
    EXPECT_TRUE(waitUntil([&] { return !alert(); }));
}

TEST_F(PublishingFixture, AfterSuccessCloseFinishesAsNotCompleted) {
    agent->pressPublish();
    agent->endPublishing(nullptr, kWatchURL);
    press("Close");
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_EQ(finished, false);
    EXPECT_TRUE(opener.opened().isEmpty());
}

TEST_F(PublishingFixture, AfterFailureOnlyCloseIsOfferedAndItFinishesAsCompleted) {
    agent->pressPublish();
    agent->endPublishing(
        makeError(403, QStringLiteral("YouTubeErrorDomain"), QStringLiteral("quotaExceeded")));
    ASSERT_TRUE(alert());
    EXPECT_EQ(alert()->title(), "Your video could not be published.");
    EXPECT_EQ(actionTitles(), QStringList{"Close"});
    EXPECT_TRUE(uploadFileRemoved());

    press("Close");
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_EQ(finished, true);
    EXPECT_EQ(finishes, 1);
    EXPECT_TRUE(opener.opened().isEmpty());
}

TEST_F(PublishingFixture, TheAlertSpeaksTheUsersLanguage) {
    testing_support::ScopedEnv german("LANG", "de_DE.UTF-8");
    agent->pressPublish();
    agent->endPublishing(nullptr, kWatchURL);
    ASSERT_TRUE(alert());
    EXPECT_EQ(alert()->title(), "Dein Video wurde veröffentlicht.");
    EXPECT_EQ(actionTitles(), (QStringList{"Auf YouTube ansehen", "Schließen"}));
}

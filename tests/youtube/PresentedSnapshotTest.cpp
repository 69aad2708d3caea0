// What automation scripts see of, and do to, the screens presented over the
// editor: the publishing form, its progress and the alert. (Typing into the
// form and pressing its buttons run end to end in PublishEndToEndTest.)

#include "PresentedSnapshot.h"
#include "YouTubeFakes.h"
#include "platform/ui/Alert.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"
#include "support/Wait.h"
#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include <QJsonObject>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

TEST(PresentedSnapshot, ReadsThePublishingFormAndPressesTheAlertsButtonsByTitle) {
    Window window;
    auto root = std::make_shared<ViewController>();
    window.setRootViewController(root);
    window.resize(400, 600);
    window.show();
    ViewController* editor = root.get();
    const QJsonObject nothing = PresentedSnapshot::dump(editor);
    for (const char* key :
         {"alert", "publishingDescription", "publishingCategory", "uploadProgress"})
        EXPECT_TRUE(nothing[key].isNull()) << key;
    EXPECT_EQ(PresentedSnapshot::pressButton(editor, "Close"),
              "nothing is presented over the editor");
    EXPECT_EQ(PresentedSnapshot::fillField(editor, "title", "x"), "no publishing form is shown");

    auto form = std::make_shared<FakeUploadForm>();
    form->members_.description.value = "T L";
    form->defaultCategory = "20";
    form->setProperty("uploadProgress", 0.25);
    auto navigation = NavigationController::initWithRootViewController(form);
    editor->presentViewController_animated_completion(navigation, false);
    ASSERT_EQ(PresentedSnapshot::publishingForm(editor), form.get());
    EXPECT_TRUE(waitUntil([&] { return PresentedSnapshot::isPublishingFormOnTop(editor); }));
    EXPECT_FALSE(PresentedSnapshot::isPublishing(editor));
    // Publishing once the overlay has faded in and its spinner turns.
    auto* overlay = new TXYouTubeActivityProgressOverlay(navigation->view()->bounds());
    navigation->view()->addSubview(overlay);
    overlay->setShowing_animated(true, true);
    EXPECT_FALSE(PresentedSnapshot::isPublishing(editor));
    EXPECT_TRUE(waitUntil([&] { return PresentedSnapshot::isPublishing(editor); }));

    int closes = 0;
    auto alert = Alert::make("Your video has been published.", QString());
    alert->addAction(AlertAction::make("View on YouTube", AlertAction::Style::Default));
    alert->addAction(
        AlertAction::make("Close", AlertAction::Style::Cancel, [&](AlertAction&) { ++closes; }));
    navigation->presentViewController_animated_completion(alert, true);
    EXPECT_FALSE(PresentedSnapshot::isPublishingFormOnTop(editor));
    EXPECT_FALSE(PresentedSnapshot::isAlertShown(editor)) << "still fading in";
    EXPECT_TRUE(waitUntil([&] { return PresentedSnapshot::isAlertShown(editor); }));
    const QJsonObject shown = PresentedSnapshot::dump(editor);
    EXPECT_EQ(shown["alert"].toString(), "Your video has been published.");
    EXPECT_EQ(shown["publishingDescription"].toString(), "T L");
    EXPECT_EQ(shown["publishingCategory"].toString(), "20");
    EXPECT_DOUBLE_EQ(shown["uploadProgress"].toDouble(), 0.25);

    EXPECT_EQ(PresentedSnapshot::pressButton(editor, "Later"),
              "the alert \"Your video has been published.\" has no button Later (it has: View on "
              "YouTube, Close)");
    EXPECT_EQ(PresentedSnapshot::pressButton(editor, "Close"), "");
    EXPECT_TRUE(waitUntil([&] { return closes == 1; }));
    EXPECT_TRUE(waitUntil([&] { return PresentedSnapshot::dump(editor)["alert"].isNull(); }));
}

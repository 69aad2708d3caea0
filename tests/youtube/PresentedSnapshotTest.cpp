// What automation scripts see of, and do to, the screens presented over the
// editor: the publishing form and the alert.

#include "PresentedSnapshot.h"
#include "FakeUploadForm.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"
#include "support/Wait.h"

#include <QJsonObject>
#include <QTest>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

TEST(PresentedSnapshot, ReadsThePublishingFormAndPressesTheAlertsButtonsByTitle) {
    Window window;
    auto editor = std::make_shared<ViewController>();
    window.setRootViewController(editor);
    window.resize(400, 600);
    window.show();

    const QJsonObject nothing = PresentedSnapshot::dump(editor.get());
    for (const char* key :
         {"alert", "publishingDescription", "publishingCategory", "uploadProgress"})
        EXPECT_TRUE(nothing[key].isNull()) << key;
    EXPECT_EQ(PresentedSnapshot::pressAlertAction(editor.get(), "Close"), "no alert is shown");

    auto form = std::make_shared<FakeUploadForm>();
    form->table_.descriptionCell.value = "T L";
    form->defaultCategory = "20";
    form->setProperty("uploadProgress", 0.25);
    auto navigation = NavigationController::initWithRootViewController(form);
    editor->presentViewController_animated_completion(navigation, false);
    ASSERT_EQ(PresentedSnapshot::publishingForm(editor.get()), form.get());

    int closes = 0;
    auto alert = Alert::make("Your video has been published.", QString());
    alert->addAction(AlertAction::make("View on YouTube", AlertAction::Style::Default));
    alert->addAction(
        AlertAction::make("Close", AlertAction::Style::Cancel, [&](AlertAction&) { ++closes; }));
    navigation->presentViewController_animated_completion(alert, false);

    const QJsonObject shown = PresentedSnapshot::dump(editor.get());
    EXPECT_EQ(shown["alert"].toString(), "Your video has been published.");
    EXPECT_EQ(shown["publishingDescription"].toString(), "T L");
    EXPECT_EQ(shown["publishingCategory"].toString(), "20");
    EXPECT_DOUBLE_EQ(shown["uploadProgress"].toDouble(), 0.25);

    EXPECT_EQ(PresentedSnapshot::pressAlertAction(editor.get(), "Later"),
              "the alert \"Your video has been published.\" has no button Later (it has: View on "
              "YouTube, Close)");
    ASSERT_TRUE(waitUntil([&] { return alert->buttonForAction(alert->actions()[1].get()); }));
    EXPECT_EQ(PresentedSnapshot::pressAlertAction(editor.get(), "Close"), "");
    EXPECT_TRUE(waitUntil([&] { return closes == 1; }));
    EXPECT_EQ(PresentedSnapshot::alert(editor.get()), nullptr);
    EXPECT_TRUE(PresentedSnapshot::dump(editor.get())["alert"].isNull());
}

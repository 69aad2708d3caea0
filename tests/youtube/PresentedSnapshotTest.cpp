// What automation scripts see of, and do to, the screens presented over the
// editor: the publishing form, its progress and the alert.

#include "PresentedSnapshot.h"
#include "FakeUploadForm.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"
#include "support/Wait.h"
#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include <QJsonObject>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QTest>
#include <QVBoxLayout>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

// A form whose cells are widgets the user types into, as a plug-in's are.
class TypedTable : public QWidget {
    Q_OBJECT
  public:
    TypedTable() {
        auto* rows = new QVBoxLayout(this);
        rows->addWidget(title = new QLineEdit);
        rows->addWidget(description = new QPlainTextEdit);
    }
    Q_INVOKABLE QObject* cellForRowAtIndexPath(int section, int row) const {
        return section == 0 && row == 0   ? static_cast<QObject*>(title)
               : section == 0 && row == 1 ? static_cast<QObject*>(description)
                                          : nullptr;
    }
    QLineEdit* title;
    QPlainTextEdit* description;
};

class TypedForm : public ViewController {
    Q_OBJECT
    Q_PROPERTY(QObject* _table READ table)
  public:
    QObject* table() { return &table_; }
    TypedTable table_;

  protected:
    void loadView() override {
        auto* root = new View();
        table_.setParent(root);
        table_.setGeometry(0, 0, 300, 300);
        setView(root);
    }
};

struct Screen {
    Screen() {
        window.setRootViewController(editor);
        window.resize(400, 600);
        window.show();
    }
    Window window;
    std::shared_ptr<ViewController> editor = std::make_shared<ViewController>();
};

} // namespace

TEST(PresentedSnapshot, ReadsThePublishingFormAndPressesTheAlertsButtonsByTitle) {
    Screen screen;
    ViewController* editor = screen.editor.get();
    const QJsonObject nothing = PresentedSnapshot::dump(editor);
    for (const char* key :
         {"alert", "publishingDescription", "publishingCategory", "uploadProgress"})
        EXPECT_TRUE(nothing[key].isNull()) << key;
    EXPECT_EQ(PresentedSnapshot::pressButton(editor, "Close"),
              "nothing is presented over the editor");

    auto form = std::make_shared<FakeUploadForm>();
    form->table_.descriptionCell.value = "T L";
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
    EXPECT_FALSE(PresentedSnapshot::isAlertShown(editor)); // still fading in
    EXPECT_TRUE(waitUntil([&] { return PresentedSnapshot::isAlertShown(editor); }));

    const QJsonObject shown = PresentedSnapshot::dump(editor);
    EXPECT_EQ(shown["alert"].toString(), "Your video has been published.");
    EXPECT_EQ(shown["publishingDescription"].toString(), "T L");
    EXPECT_EQ(shown["publishingCategory"].toString(), "20");
    EXPECT_DOUBLE_EQ(shown["uploadProgress"].toDouble(), 0.25);

    ASSERT_TRUE(waitUntil([&] { return alert->buttonForAction(alert->actions()[1].get()); }));
    EXPECT_EQ(PresentedSnapshot::pressButton(editor, "Later"),
              "the alert \"Your video has been published.\" has no button Later (it has: View on "
              "YouTube, Close)");
    EXPECT_EQ(PresentedSnapshot::pressButton(editor, "Close"), "");
    EXPECT_TRUE(waitUntil([&] { return closes == 1; }));
    EXPECT_EQ(PresentedSnapshot::alert(editor), nullptr);
    EXPECT_FALSE(PresentedSnapshot::isAlertShown(editor));
    EXPECT_TRUE(PresentedSnapshot::dump(editor)["alert"].isNull());
}

TEST(PresentedSnapshot, TypesIntoTheFormsFieldsAndPressesItsNavigationButtons) {
    Screen screen;
    ViewController* editor = screen.editor.get();
    EXPECT_EQ(PresentedSnapshot::fillField(editor, "title", "x"), "no publishing form is shown");

    auto form = std::make_shared<TypedForm>();
    form->table_.title->setText("Old title");
    form->table_.description->setPlainText("Old\ndescription");
    int publishes = 0;
    auto navigation = NavigationController::initWithRootViewController(form);
    NavigationController::navigationItemOf(form.get())
        ->setRightBarButtonItem(ToolbarItem::titledItem("Publish", [&] { ++publishes; }));
    editor->presentViewController_animated_completion(navigation, false);
    ASSERT_TRUE(waitUntil([&] { return PresentedSnapshot::isPublishingFormOnTop(editor); }));

    EXPECT_EQ(PresentedSnapshot::fillField(editor, "title", "My run"), "");
    EXPECT_EQ(PresentedSnapshot::fillField(editor, "description", "Lap one, lap two"), "");
    EXPECT_EQ(form->table_.title->text(), "My run");
    EXPECT_EQ(form->table_.description->toPlainText(), "Lap one, lap two");
    EXPECT_EQ(PresentedSnapshot::fillField(editor, "tags", "x"),
              "the form has no field tags (title, description)");

    form->table_.title->setReadOnly(true);
    EXPECT_EQ(PresentedSnapshot::fillField(editor, "title", "x"),
              "the form's title cannot be edited now");

    EXPECT_EQ(PresentedSnapshot::pressButton(editor, "Publish"), "");
    EXPECT_TRUE(waitUntil([&] { return publishes == 1; }));
}

#include "PresentedSnapshotTest.moc"

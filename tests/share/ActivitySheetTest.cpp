// The desktop's activity sheet on fake activities: what it offers, in which
// order, and how picking, finishing and cancelling reach its completion.

#include "platform/ui/share/ActivitySheet.h"
#include "ShareFakes.h"
#include "platform/runtime/MainQueue.h"
#include "platform/services/ActivityTypes.h"
#include "platform/ui/Toolbar.h"
#include "platform/ui/ToolbarItem.h"
#include "platform/ui/Window.h"
#include "platform/ui/share/SystemActivities.h"
#include "support/Wait.h"
#include "ui/UiInput.h"

#include <QListWidget>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::FakeActivity;
using testing_support::waitUntil;

namespace {

struct Report {
    int calls = 0;
    QString type;
    bool completed = false;
};

class ActivitySheetTest : public ::testing::Test {
  protected:
    void SetUp() override {
        window.resize(700, 500);
        window.setRootViewController(root);
        window.show();
        waitUntil([&] { return root->appearance() == ViewController::Appearance::Appeared; });
    }
    // A sheet lets itself go on the main queue once it has reported; that
    // must run before the application object goes.
    void TearDown() override { MainQueue::runPending(); }

    std::shared_ptr<FakeActivity> builtIn(const QString& type, bool canPerform = true) {
        auto activity = std::make_shared<FakeActivity>(type, type.section('.', -1), canPerform);
        builtIns.append(activity);
        return activity;
    }

    std::shared_ptr<ActivitySheet> sheetWith(const QList<std::shared_ptr<Activity>>& apps = {}) {
        auto sheet = ActivitySheet::make(items, apps);
        sheet->setCompletionWithItemsHandler(
            [this](const QString& type, bool completed, const QVariantList&, ErrorPtr) {
                ++report.calls;
                report.type = type;
                report.completed = completed;
            });
        return sheet;
    }

    void present(const std::shared_ptr<ActivitySheet>& sheet) {
        root->presentViewController_animated_completion(sheet, false);
        waitUntil([&] { return sheet->appearance() == ViewController::Appearance::Appeared; });
    }

    static QStringList typesOf(const ActivityViewController::ActivityList& activities) {
        QStringList types;
        for (const auto& activity : activities)
            types.append(activity->activityType());
        return types;
    }

    static QStringList rowsOf(ActivitySheet& sheet) {
        QStringList rows;
        for (int i = 0; i < sheet.activityList()->count(); ++i)
            rows.append(sheet.activityList()->item(i)->data(Qt::UserRole).toString());
        return rows;
    }

    Window window;
    std::shared_ptr<ViewController> root = std::make_shared<ViewController>();
    QList<std::shared_ptr<Activity>> builtIns;
    Implementation<SystemActivities::Maker>::Replacement replacement =
        SystemActivities::implementation().replace([this] { return builtIns; });
    QVariantList items{QStringLiteral("Look at this"), QUrl("https://store.example/apps/x"),
                       QUrl::fromLocalFile("/tmp/recording.mp4")};
    Report report;
};

} // namespace

TEST_F(ActivitySheetTest, OffersWhatCanPerformInThePreferredOrderWithoutExcludedTypes) {
    builtIn(MailActivityType);
    builtIn(MessageActivityType);
    builtIn(CopyToPasteboardActivityType);
    builtIn(PostToFacebookActivityType, false);
    builtIn(SaveToFilesActivityType);
    auto youTube = std::make_shared<FakeActivity>("TXPublishToYouTube", "YouTube");
    auto sheet = sheetWith({youTube});

    EXPECT_EQ(typesOf(sheet->offeredActivities()),
              (QStringList{MailActivityType, MessageActivityType, CopyToPasteboardActivityType,
                           SaveToFilesActivityType, "TXPublishToYouTube"}))
        << "the sheet's own order, application activities last";

    sheet->setExcludedActivityTypes({CopyToPasteboardActivityType});
    sheet->setPreferredActivityOrder({MailActivityType, MessageActivityType, "TXPublishToYouTube",
                                      CopyToPasteboardActivityType, PostToFacebookActivityType});
    EXPECT_EQ(typesOf(sheet->offeredActivities()),
              (QStringList{MailActivityType, MessageActivityType, "TXPublishToYouTube",
                           SaveToFilesActivityType}))
        << "preferred first and in that order; excluded although preferred; Facebook cannot";
    EXPECT_EQ(youTube->lastAskedItems, items) << "canPerform is asked with the sheet's items";

    sheet->setModalPresentationStyle(ViewController::ModalPresentationStyle::FullScreen);
    present(sheet);
    EXPECT_EQ(rowsOf(*sheet), typesOf(sheet->offeredActivities()));
    EXPECT_EQ(sheet->activityList()->item(2)->text(), "YouTube");
}

TEST_F(ActivitySheetTest, AnActivityThatLearnsLateJoinsTheList) {
    builtIn(MailActivityType);
    auto late = builtIn(MessageActivityType, false);
    auto sheet = sheetWith();
    present(sheet);
    EXPECT_EQ(rowsOf(*sheet), QStringList{MailActivityType});
    late->becomeAvailable(true);
    EXPECT_EQ(rowsOf(*sheet), (QStringList{MailActivityType, MessageActivityType}));
    EXPECT_EQ(sheet->activityList()->currentRow(), 0) << "the untouched choice stays at the top";
}

TEST_F(ActivitySheetTest, AClickPreparesPerformsAndReportsTheCompletedType) {
    builtIn(MailActivityType);
    auto message = builtIn(MessageActivityType);
    auto sheet = sheetWith();
    present(sheet);
    QListWidget* list = sheet->activityList();
    ui_input::tap(list->viewport(), QRectF(list->visualItemRect(list->item(1))).center());

    ASSERT_TRUE(waitUntil([&] { return report.calls > 0; }));
    EXPECT_EQ(message->calls, (QStringList{"prepare", "activityViewController", "perform"}));
    EXPECT_EQ(message->preparedItems, items);
    EXPECT_EQ(report.type, MessageActivityType);
    EXPECT_TRUE(report.completed);
    EXPECT_EQ(root->presentedViewController(), nullptr) << "the sheet made way";
    waitUntil([] { return false; }, 50);
    EXPECT_EQ(report.calls, 1);
}

TEST_F(ActivitySheetTest, AFailedActivityIsReportedNotCompleted) {
    auto mail = builtIn(MailActivityType);
    mail->completesWith.reset();
    auto sheet = sheetWith();
    present(sheet);
    ASSERT_TRUE(sheet->performActivityNamed("Mail")) << "found by its title too";
    ASSERT_TRUE(waitUntil([&] { return mail->calls.contains("perform"); }));
    EXPECT_EQ(report.calls, 0) << "nothing is reported while the activity works";
    mail->activityDidFinish(false);
    mail->activityDidFinish(true);
    EXPECT_EQ(report.calls, 1);
    EXPECT_EQ(report.type, MailActivityType);
    EXPECT_FALSE(report.completed);
}

TEST_F(ActivitySheetTest, AnActivitysControllerIsPresentedAndDismissedWhenItFinishes) {
    auto youTube = std::make_shared<FakeActivity>("TXPublishToYouTube", "YouTube");
    youTube->controller = std::make_shared<ViewController>();
    auto sheet = sheetWith({youTube});
    present(sheet);
    ASSERT_TRUE(sheet->performActivityNamed("TXPublishToYouTube"));
    ASSERT_TRUE(
        waitUntil([&] { return root->presentedViewController() == youTube->controller.get(); }));
    EXPECT_FALSE(youTube->calls.contains("perform"));
    youTube->activityDidFinish(true);
    ASSERT_TRUE(waitUntil([&] { return root->presentedViewController() == nullptr; }));
    EXPECT_EQ(report.type, "TXPublishToYouTube");
    EXPECT_TRUE(report.completed);
}

TEST_F(ActivitySheetTest, TheKeyboardReachesEveryRowAndEscapeCancels) {
    builtIn(MailActivityType);
    auto save = builtIn(SaveToFilesActivityType);
    {
        auto sheet = sheetWith();
        sheet->setModalPresentationStyle(ViewController::ModalPresentationStyle::FullScreen);
        present(sheet);
        QListWidget* list = sheet->activityList();
        EXPECT_TRUE(list->hasFocus());
        ui_input::key(list, Qt::Key_Down);
        ui_input::key(list, Qt::Key_Return);
        ASSERT_TRUE(waitUntil([&] { return report.calls > 0; }));
        EXPECT_EQ(report.type, SaveToFilesActivityType);
        EXPECT_TRUE(save->calls.contains("perform"));
    }
    report = {};
    auto sheet = sheetWith();
    present(sheet);
    ui_input::key(sheet->activityList(), Qt::Key_Escape);
    ASSERT_TRUE(waitUntil([&] { return report.calls > 0; }));
    EXPECT_TRUE(report.type.isNull());
    EXPECT_FALSE(report.completed);
    ASSERT_TRUE(waitUntil([&] { return root->presentedViewController() == nullptr; }));
    EXPECT_EQ(report.calls, 1);
}

TEST_F(ActivitySheetTest, APopoverStandsByItsItemAndAPressBesideItCancels) {
    builtIn(MailActivityType);
    auto* bar = new Toolbar(QRectF(0, 0, 700, 44));
    root->view()->addSubview(bar);
    auto share = ToolbarItem::systemItem(ToolbarItem::SystemItem::Action, [] {});
    bar->setItems({ToolbarItem::flexibleSpace(), share});
    bar->show();
    waitUntil([] { return false; }, 50);

    auto sheet = sheetWith();
    sheet->setModalPresentationStyle(ViewController::ModalPresentationStyle::Popover);
    sheet->setPopoverItem(share);
    present(sheet);
    QWidget* anchor = bar->widgetForItem(share.get());
    ASSERT_TRUE(anchor);
    const QRect panel = sheet->view()->geometry();
    EXPECT_LT(panel.width(), 400) << "a panel, not the whole window";
    EXPECT_GE(sheet->view()->mapTo(&window, QPoint(0, 0)).y(),
              anchor->mapTo(&window, QPoint(0, anchor->height())).y() - 1)
        << "below the share item";

    QWidget* container = sheet->view()->parentWidget();
    ui_input::tap(container, QPointF(20, 300));
    ASSERT_TRUE(waitUntil([&] { return report.calls > 0; }));
    EXPECT_FALSE(report.completed);
    EXPECT_TRUE(report.type.isNull());
}

TEST_F(ActivitySheetTest, WithNothingToOfferItSaysSo) {
    builtIn(MailActivityType, false);
    auto sheet = sheetWith();
    present(sheet);
    EXPECT_EQ(sheet->activityList()->count(), 0);
    auto* empty = sheet->view()->findChild<QLabel*>("shareEmpty");
    ASSERT_TRUE(empty);
    EXPECT_TRUE(empty->isVisible());
}

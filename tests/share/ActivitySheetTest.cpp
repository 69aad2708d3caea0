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

#include <QLabel>
#include <QListWidget>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::FakeActivity;
using testing_support::waitUntil;

namespace {

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
        builtIns.append(std::make_shared<FakeActivity>(type, type.section('.', -1), canPerform));
        return std::static_pointer_cast<FakeActivity>(builtIns.last());
    }

    // A sheet on the items, presented in `style` (unless None) and reporting
    // to `calls`, `type` and `completed`.
    std::shared_ptr<ActivitySheet>
    sheetWith(const QList<std::shared_ptr<Activity>>& apps = {},
              std::optional<ViewController::ModalPresentationStyle> style =
                  ViewController::ModalPresentationStyle::FullScreen) {
        auto sheet = ActivitySheet::make(items, apps);
        sheet->setCompletionWithItemsHandler(
            [this](const QString& t, bool c, const QVariantList&, ErrorPtr) {
                ++calls;
                type = t;
                completed = c;
            });
        if (style) {
            waitUntil([&] { return !root->presentedViewController(); });
            sheet->setModalPresentationStyle(*style);
            root->presentViewController_animated_completion(sheet, false);
            waitUntil([&] { return sheet->appearance() == ViewController::Appearance::Appeared; });
        }
        return sheet;
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
    int calls = 0;
    QString type;
    bool completed = false;
};

} // namespace

TEST_F(ActivitySheetTest, OffersWhatCanPerformInThePreferredOrderWithoutExcludedTypes) {
    builtIn(MailActivityType);
    builtIn(MessageActivityType);
    builtIn(CopyToPasteboardActivityType);
    builtIn(PostToFacebookActivityType, false);
    builtIn(SaveToFilesActivityType);
    auto youTube = std::make_shared<FakeActivity>("TXPublishToYouTube", "YouTube");
    auto sheet = sheetWith({youTube}, std::nullopt);
    const auto offered = [&] {
        QStringList types;
        for (const auto& activity : sheet->offeredActivities())
            types.append(activity->activityType());
        return types;
    };
    EXPECT_EQ(offered(),
              (QStringList{MailActivityType, MessageActivityType, CopyToPasteboardActivityType,
                           SaveToFilesActivityType, "TXPublishToYouTube"}))
        << "the sheet's own order, application activities last";

    sheet->setExcludedActivityTypes({CopyToPasteboardActivityType});
    sheet->setPreferredActivityOrder({MailActivityType, MessageActivityType, "TXPublishToYouTube",
                                      CopyToPasteboardActivityType, PostToFacebookActivityType});
    EXPECT_EQ(offered(), (QStringList{MailActivityType, MessageActivityType, "TXPublishToYouTube",
                                      SaveToFilesActivityType}))
        << "preferred first and in that order; excluded although preferred; Facebook cannot";
    EXPECT_EQ(youTube->askedItems, items) << "canPerform is asked with the sheet's items";

    sheet->setModalPresentationStyle(ViewController::ModalPresentationStyle::FullScreen);
    root->presentViewController_animated_completion(sheet, false);
    ASSERT_TRUE(waitUntil([&] { return rowsOf(*sheet) == offered(); }));
    EXPECT_EQ(sheet->activityList()->item(2)->text(), "YouTube");
}

TEST_F(ActivitySheetTest, AnActivityThatLearnsLateJoinsTheListAndNothingToOfferIsSaid) {
    builtIn(MailActivityType);
    auto late = builtIn(MessageActivityType, false);
    auto sheet = sheetWith();
    EXPECT_EQ(rowsOf(*sheet), QStringList{MailActivityType});
    late->canPerform = true;
    emit late->availabilityChanged();
    EXPECT_EQ(rowsOf(*sheet), (QStringList{MailActivityType, MessageActivityType}));
    EXPECT_EQ(sheet->activityList()->currentRow(), 0) << "the untouched choice stays at the top";
    sheet->cancel();
    ASSERT_TRUE(waitUntil([&] { return calls == 1; }));

    builtIns = {};
    builtIn(MailActivityType, false);
    sheet = sheetWith();
    EXPECT_EQ(sheet->activityList()->count(), 0);
    auto* empty = sheet->view()->findChild<QLabel*>("shareEmpty");
    ASSERT_TRUE(empty);
    EXPECT_TRUE(empty->isVisible());
}

TEST_F(ActivitySheetTest, AClickOrTheKeyboardRunsAnActivityItsEndReportedOnceAndEscapeCancels) {
    builtIn(MailActivityType);
    auto message = builtIn(MessageActivityType);
    message->completesWith.reset();
    auto sheet = sheetWith();
    QListWidget* list = sheet->activityList();
    ui_input::tap(list->viewport(), QRectF(list->visualItemRect(list->item(1))).center());
    ASSERT_TRUE(waitUntil([&] { return message->calls.contains("perform"); }));
    EXPECT_EQ(message->calls, (QStringList{"prepare", "activityViewController", "perform"}));
    EXPECT_EQ(message->askedItems, items);
    EXPECT_EQ(root->presentedViewController(), nullptr) << "the sheet made way";
    EXPECT_EQ(calls, 0) << "nothing is reported while the activity works";
    message->activityDidFinish(false);
    message->activityDidFinish(true);
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(type, MessageActivityType);
    EXPECT_FALSE(completed) << "failed, so not completed";

    message->completesWith = true;
    sheet = sheetWith();
    EXPECT_TRUE(sheet->activityList()->hasFocus());
    ui_input::key(sheet->activityList(), Qt::Key_Down);
    ui_input::key(sheet->activityList(), Qt::Key_Return);
    ASSERT_TRUE(waitUntil([&] { return calls == 2; }));
    EXPECT_EQ(type, MessageActivityType);
    EXPECT_TRUE(completed);

    sheet = sheetWith();
    ui_input::key(sheet->activityList(), Qt::Key_Escape);
    ASSERT_TRUE(waitUntil([&] { return calls == 3; }));
    EXPECT_EQ(root->presentedViewController(), nullptr);
    EXPECT_TRUE(type.isNull());
    EXPECT_FALSE(completed);
}

TEST_F(ActivitySheetTest, APopoverStandsByItsItemAndAPressBesideItCancels) {
    builtIn(MailActivityType);
    auto* bar = new Toolbar(QRectF(0, 0, 700, 44));
    root->view()->addSubview(bar);
    auto share = ToolbarItem::systemItem(ToolbarItem::SystemItem::Action, [] {});
    bar->setItems({ToolbarItem::flexibleSpace(), share});
    bar->show();
    waitUntil([] { return false; }, 50);

    auto sheet = sheetWith({}, std::nullopt);
    sheet->setPopoverItem(share);
    sheet->setModalPresentationStyle(ViewController::ModalPresentationStyle::Popover);
    root->presentViewController_animated_completion(sheet, false);
    waitUntil([&] { return sheet->appearance() == ViewController::Appearance::Appeared; });
    QWidget* anchor = bar->widgetForItem(share.get());
    ASSERT_TRUE(anchor);
    EXPECT_LT(sheet->view()->geometry().width(), 400) << "a panel, not the whole window";
    EXPECT_GE(sheet->view()->mapTo(&window, QPoint(0, 0)).y(),
              anchor->mapTo(&window, QPoint(0, anchor->height())).y() - 1)
        << "below the share item";

    ui_input::tap(sheet->view()->parentWidget(), QPointF(20, 300));
    ASSERT_TRUE(waitUntil([&] { return calls > 0; }));
    EXPECT_FALSE(completed);
    EXPECT_TRUE(type.isNull());
}

#include "ActivitySheet.h"

#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"
#include "platform/ui/share/ShareStrings.h"
#include "platform/ui/share/SystemActivities.h"

#include <QBoxLayout>
#include <QFileInfo>
#include <QFrame>
#include <QKeyEvent>
#include <QLabel>
#include <QListWidget>
#include <QPushButton>
#include <QTimer>
#include <QUrl>

#include <algorithm>

namespace platform {

namespace {
constexpr int kPanelWidth = 300;
constexpr int kRowHeight = 46;
constexpr int kHeaderHeight = 70;
constexpr int kMaxPanelHeight = 460;
} // namespace

ActivitySheet::ActivitySheet(QVariantList activityItems, ActivityList applicationActivities)
    : ActivityViewController(std::move(activityItems), std::move(applicationActivities)),
      builtIns_(SystemActivities::builtInActivities()) {
    for (const auto& activity : builtIns_ + this->applicationActivities())
        connect(activity.get(), &Activity::availabilityChanged, this, &ActivitySheet::rebuildRows);
}

std::shared_ptr<ActivitySheet> ActivitySheet::make(const QVariantList& activityItems,
                                                   const ActivityList& applicationActivities) {
    return std::shared_ptr<ActivitySheet>(new ActivitySheet(activityItems, applicationActivities));
}

ActivityViewController::ActivityList ActivitySheet::offeredActivities() {
    ActivityList all;
    for (const auto& activity : builtIns_ + applicationActivities())
        if (activity && !excludedActivityTypes().contains(activity->activityType()))
            all.append(activity);
    // The preferred types lead, in their order; the rest keep the sheet's.
    const QStringList preferred = preferredActivityOrder();
    std::stable_sort(all.begin(), all.end(), [&](const auto& a, const auto& b) {
        auto rank = [&](const auto& activity) {
            const qsizetype at = preferred.indexOf(activity->activityType());
            return at < 0 ? preferred.size() : at;
        };
        return rank(a) < rank(b);
    });
    ActivityList offered;
    for (const auto& activity : all)
        if (activity->canPerformWithActivityItems(activityItems()))
            offered.append(activity);
    return offered;
}

bool ActivitySheet::performActivityNamed(const QString& typeOrTitle) {
    const ActivityList offered = offeredActivities();
    auto found = std::find_if(offered.begin(), offered.end(), [&](const auto& activity) {
        return activity->activityType() == typeOrTitle;
    });
    if (found == offered.end())
        found = std::find_if(offered.begin(), offered.end(), [&](const auto& activity) {
            return activity->activityTitle().compare(typeOrTitle, Qt::CaseInsensitive) == 0;
        });
    if (found == offered.end() || running_ || hasReported())
        return false;
    pick(*found);
    return true;
}

void ActivitySheet::cancel() {
    if (running_ || hasReported() || cancelling_)
        return;
    cancelling_ = true;
    keepAlive_ = std::static_pointer_cast<ActivityViewController>(shared_from_this());
    auto report = [this] {
        reportCompletion(QString(), false);
        releaseSelfLater();
    };
    if (presentingViewController())
        dismissViewControllerAnimated_completion(true, report);
    else
        report();
}

void ActivitySheet::pick(const std::shared_ptr<Activity>& activity) {
    running_ = activity;
    keepAlive_ = std::static_pointer_cast<ActivityViewController>(shared_from_this());
    QPointer<ViewController> presenter = presentingViewController();
    activity->setPresenter(presenter);
    std::weak_ptr<Activity> weakActivity = activity;
    activity->setFinishHandler([this, weakActivity](bool completed) {
        if (auto finished = weakActivity.lock())
            activityFinished(finished, completed);
    });
    activity->prepareWithActivityItems(activityItems());
    if (activity->isFinished())
        return;
    runningController_ = activity->activityViewController();
    // The sheet makes way before the activity works, so what the activity
    // shows (its controller, a dialog, another program) is not covered.
    auto work = [this, presenter, activity] {
        if (activity->isFinished())
            return;
        if (runningController_ && presenter)
            presenter->presentViewController_animated_completion(runningController_, true);
        else
            activity->performActivity();
    };
    if (presenter)
        dismissViewControllerAnimated_completion(false, work);
    else
        work();
}

void ActivitySheet::activityFinished(const std::shared_ptr<Activity>& activity, bool completed) {
    if (runningController_) {
        if (runningController_->presentingViewController())
            runningController_->dismissViewControllerAnimated_completion(true);
        runningController_.reset();
    }
    running_.reset();
    reportCompletion(activity->activityType(), completed);
    releaseSelfLater();
}

void ActivitySheet::releaseSelfLater() {
    // The caller may be this sheet's own member function.
    MainQueue::async([keep = std::move(keepAlive_)] {});
}

void ActivitySheet::viewDidAppear(bool animated) {
    ActivityViewController::viewDidAppear(animated);
    if (list_) {
        list_->setFocus(Qt::PopupFocusReason);
        if (list_->count() > 0 && list_->currentRow() < 0)
            list_->setCurrentRow(0);
    }
}

void ActivitySheet::viewDidDisappear(bool animated) {
    ActivityViewController::viewDidDisappear(animated);
    // Dismissed from outside (a press beside the popover): a cancel.
    if (!presentingViewController() && !running_ && !cancelling_ && !hasReported()) {
        cancelling_ = true;
        keepAlive_ = std::static_pointer_cast<ActivityViewController>(shared_from_this());
        reportCompletion(QString(), false);
        releaseSelfLater();
    }
}

void ActivitySheet::loadView() {
    const bool popover = modalPresentationStyle() == ModalPresentationStyle::Popover;
    auto* root = new View();
    root->setAccessibleName(ShareStrings::text("SHARE", "Share"));
    root->setBackgroundColor(popover ? QColor(Qt::transparent) : QColor(0xf2, 0xf2, 0xf7));
    auto* outer = new QVBoxLayout(root);
    outer->setContentsMargins(0, 0, 0, 0);

    auto* card = new QFrame(root);
    card->setObjectName(QStringLiteral("shareCard"));
    card->setStyleSheet(
        QStringLiteral(
            "#shareCard { background: %1; border-radius: %2px; }"
            "#shareTitle { font-size: 15px; font-weight: 600; color: #1c1c1e; }"
            "#shareSubtitle { font-size: 12px; color: #6e6e73; }"
            "#shareEmpty { font-size: 13px; color: #6e6e73; }"
            "QListWidget { background: transparent; border: none; outline: none; font-size: 14px; }"
            "QListWidget::item { padding: 4px 6px; border-radius: 8px; color: #1c1c1e; }"
            "QListWidget::item:selected { background: #dce8fb; color: #1c1c1e; }"
            "QListWidget::item:hover { background: #ececf1; }"
            "QPushButton#shareCancel { font-size: 15px; padding: 10px; border-radius: 10px;"
            " background: white; color: #0a60d0; border: none; }"
            "QPushButton#shareCancel:focus { border: 2px solid #0a60d0; }")
            .arg(popover ? QStringLiteral("rgba(252,252,253,250)") : QStringLiteral("transparent"))
            .arg(popover ? 14 : 0));
    auto* column = new QVBoxLayout(card);
    column->setContentsMargins(popover ? 10 : 18, 12, popover ? 10 : 18, popover ? 10 : 18);
    column->setSpacing(6);

    auto* title = new QLabel(ShareStrings::text("SHARE", "Share"), card);
    title->setObjectName(QStringLiteral("shareTitle"));
    title->setAlignment(Qt::AlignCenter);
    column->addWidget(title);
    // Which recording is being shared: the first file's name.
    QString subject;
    for (const QVariant& item : activityItems())
        if (item.typeId() == QMetaType::QUrl && item.toUrl().isLocalFile()) {
            subject = QFileInfo(item.toUrl().toLocalFile()).fileName();
            break;
        }
    auto* subtitle = new QLabel(subject, card);
    subtitle->setObjectName(QStringLiteral("shareSubtitle"));
    subtitle->setAlignment(Qt::AlignCenter);
    subtitle->setVisible(!subject.isEmpty());
    column->addWidget(subtitle);

    list_ = new QListWidget(card);
    list_->setAccessibleName(ShareStrings::text("SHARE", "Share"));
    list_->setIconSize(QSize(32, 32));
    list_->setUniformItemSizes(true);
    list_->setSpacing(1);
    list_->setFocusPolicy(Qt::StrongFocus);
    list_->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    list_->installEventFilter(this);
    connect(list_, &QListWidget::itemClicked, this, [this](QListWidgetItem* item) {
        performActivityNamed(item->data(Qt::UserRole).toString());
    });
    connect(list_, &QListWidget::itemActivated, this, [this](QListWidgetItem* item) {
        performActivityNamed(item->data(Qt::UserRole).toString());
    });
    column->addWidget(list_, 1);

    emptyLabel_ = new QLabel(
        ShareStrings::text("SHARE_NOTHING", "Nothing on this computer can share this recording."),
        card);
    emptyLabel_->setObjectName(QStringLiteral("shareEmpty"));
    emptyLabel_->setAlignment(Qt::AlignCenter);
    emptyLabel_->setWordWrap(true);
    column->addWidget(emptyLabel_);

    if (!popover) {
        cancelButton_ = new QPushButton(ShareStrings::text("CANCEL", "Cancel"), card);
        cancelButton_->setObjectName(QStringLiteral("shareCancel"));
        cancelButton_->setAccessibleName(cancelButton_->text());
        cancelButton_->installEventFilter(this);
        connect(cancelButton_, &QPushButton::clicked, this, [this] { cancel(); });
        column->addWidget(cancelButton_);
    }
    outer->addWidget(card);
    root->installEventFilter(this);
    setView(root);
    rebuildRows();
}

void ActivitySheet::rebuildRows() {
    if (!list_)
        return;
    // The row the user moved to stays chosen; untouched, the first row is.
    const QString current =
        list_->currentRow() > 0 ? list_->currentItem()->data(Qt::UserRole).toString() : QString();
    list_->clear();
    int row = 0;
    for (const auto& activity : offeredActivities()) {
        QImage image = activity->activityImage();
        if (image.isNull())
            image = ShareStrings::icon({}, activity->activityTitle(), QColor(0x8e, 0x8e, 0x93));
        auto* item =
            new QListWidgetItem(QIcon(QPixmap::fromImage(image)), activity->activityTitle(), list_);
        item->setData(Qt::UserRole, activity->activityType());
        item->setSizeHint(QSize(0, kRowHeight));
        if (activity->activityType() == current)
            list_->setCurrentItem(item);
        ++row;
    }
    if (list_->currentRow() < 0 && row > 0)
        list_->setCurrentRow(0);
    emptyLabel_->setVisible(row == 0);
    list_->setVisible(row > 0);

    setPreferredContentSize(
        QSizeF(kPanelWidth,
               std::min(kMaxPanelHeight, kHeaderHeight + std::max(row, 1) * (kRowHeight + 2))));
    if (auto* container = qobject_cast<View*>(view()->parentWidget())) {
        container->setNeedsLayout();
        container->layoutIfNeeded();
    }
}

bool ActivitySheet::eventFilter(QObject* watched, QEvent* event) {
    if (event->type() == QEvent::KeyPress &&
        static_cast<QKeyEvent*>(event)->key() == Qt::Key_Escape) {
        cancel();
        return true;
    }
    return ActivityViewController::eventFilter(watched, event);
}

} // namespace platform

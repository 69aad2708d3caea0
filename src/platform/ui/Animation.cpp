#include "platform/ui/Animation.h"

#include "platform/ui/ViewAlpha.h"

#include <QCoreApplication>
#include <QEasingCurve>
#include <QHash>
#include <QPointer>
#include <QVariantAnimation>
#include <QWidget>
#include <memory>
#include <vector>

namespace platform {

namespace {

// The completion of one animations block: it runs when the last of the
// block's changes has ended.
struct Group {
    int pending = 0;
    bool finished = true;
    std::function<void(bool)> completion;

    void partEnded(bool ranToEnd) {
        if (!ranToEnd)
            finished = false;
        if (--pending == 0)
            complete();
    }
    void complete() {
        if (!completion)
            return;
        // Deferred so that a completion never runs inside the code that
        // replaced or destroyed its animation.
        QMetaObject::invokeMethod(
            QCoreApplication::instance(),
            [completion = std::move(completion), done = finished] { completion(done); },
            Qt::QueuedConnection);
        completion = nullptr;
    }
};

class AlphaAnimation : public QVariantAnimation {
  public:
    AlphaAnimation(QWidget* widget, std::shared_ptr<Group> group)
        : QVariantAnimation(widget), widget_(widget), group_(std::move(group)) {
        connect(this, &QVariantAnimation::valueChanged, this, [this](const QVariant& value) {
            if (widget_)
                ViewAlpha::setPresentationAlpha(widget_, value.toReal());
        });
        connect(this, &QAbstractAnimation::finished, this, [this] { end(true); });
    }
    ~AlphaAnimation() override { end(false); }

    void cancel() {
        end(false);
        stop();
    }

  private:
    void end(bool ranToEnd) {
        if (ended_)
            return;
        ended_ = true;
        group_->partEnded(ranToEnd);
        if (ranToEnd)
            deleteLater();
    }

    QPointer<QWidget> widget_;
    std::shared_ptr<Group> group_;
    bool ended_ = false;
};

struct Change {
    QPointer<QWidget> widget;
    qreal target;
};

thread_local std::vector<std::vector<Change>*> collectors;

QHash<const QWidget*, QPointer<AlphaAnimation>>& running() {
    static QHash<const QWidget*, QPointer<AlphaAnimation>> animations;
    return animations;
}

} // namespace

bool Animation::inAnimationBlock() {
    return !collectors.empty();
}

bool Animation::isAnimating(const QWidget* widget) {
    auto found = running().find(widget);
    return found != running().end() && found.value() &&
           found.value()->state() == QAbstractAnimation::Running;
}

void Animation::addAlphaChange(QWidget* widget, qreal target) {
    if (collectors.empty())
        return;
    std::vector<Change>& changes = *collectors.back();
    for (Change& change : changes) {
        if (change.widget == widget) {
            change.target = target;
            return;
        }
    }
    changes.push_back({widget, target});
}

void Animation::cancelAlphaAnimation(QWidget* widget) {
    auto found = running().find(widget);
    if (found == running().end())
        return;
    QPointer<AlphaAnimation> animation = found.value();
    running().erase(found);
    if (animation) {
        animation->cancel();
        animation->deleteLater();
    }
}

void Animation::animateWithDuration(double duration, const std::function<void()>& animations,
                                    std::function<void(bool finished)> completion) {
    std::vector<Change> changes;
    collectors.push_back(&changes);
    if (animations)
        animations();
    collectors.pop_back();

    auto group = std::make_shared<Group>();
    group->completion = std::move(completion);
    group->pending = 1; // held until every part has been started

    for (const Change& change : changes) {
        QWidget* widget = change.widget;
        if (!widget)
            continue;
        const qreal from = ViewAlpha::presentationAlpha(widget);
        cancelAlphaAnimation(widget);
        if (duration <= 0.0 || qFuzzyCompare(from + 1.0, change.target + 1.0)) {
            ViewAlpha::setPresentationAlpha(widget, change.target);
            continue;
        }
        auto* animation = new AlphaAnimation(widget, group);
        ++group->pending;
        animation->setStartValue(from);
        animation->setEndValue(change.target);
        animation->setDuration(int(duration * 1000.0 + 0.5));
        animation->setEasingCurve(QEasingCurve::InOutQuad);
        running().insert(widget, animation);
        QObject::connect(animation, &QObject::destroyed, QCoreApplication::instance(), [widget] {
            // Only our own entry: a later animation may have
            // taken the widget's place already.
            auto entry = running().find(widget);
            if (entry != running().end() && !entry.value())
                running().erase(entry);
        });
        animation->start();
    }
    group->partEnded(true);
}

} // namespace platform

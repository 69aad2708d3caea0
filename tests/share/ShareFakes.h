#pragma once

// Doubles of the share services, for tests that put them under the editor or
// the sheet through each service's implementation().

#include "platform/services/ExtensionRegistry.h"
#include "platform/services/PublishingSupport.h"
#include "platform/services/store/StoreLookup.h"
#include "platform/ui/Activity.h"
#include "platform/ui/UrlOpener.h"
#include "platform/ui/share/ActivityViewController.h"
#include "platform/ui/share/FileManagerService.h"
#include "platform/ui/share/SaveLocationChooser.h"

#include <QList>
#include <QSet>
#include <QUrl>
#include <atomic>
#include <mutex>

namespace testing_support {

// Answers every request with `response` from another thread, as the real
// service does; remembers the requests.
class FakeStoreLookup final : public platform::StoreLookup {
  public:
    platform::StoreLookupResponse response;
    platform::ErrorPtr error;
    void startRequest(const platform::StoreLookupRequest& request, Callback callback) override;
    QList<platform::StoreLookupRequest> requests() const;
    std::atomic<bool> calledOnMainThread{false};

  private:
    mutable std::mutex mutex_;
    QList<platform::StoreLookupRequest> requests_;
};

// One item of a store answer.
QVariantMap storeItem(const QString& name, const QString& artist, const QString& link,
                      const QStringList& genres = {});

class FakeExtensionRegistry final : public platform::ExtensionRegistry {
  public:
    QHash<QString, bool> installed; // identifier -> enabled
    std::optional<platform::ExtensionManifest>
    extensionWithIdentifier(const QString& identifier, bool excludingDisabled) override;
};

class FakePublishingSupport final : public platform::PublishingSupport {
  public:
    bool present = false;
    bool isYouTubeSupportPresent() override { return present; }
};

// An activity whose answers a test sets; it records what the sheet did.
class FakeActivity final : public platform::Activity {
    Q_OBJECT
  public:
    FakeActivity(QString type, QString title, bool canPerform = true)
        : type_(std::move(type)), title_(std::move(title)), canPerform_(canPerform) {}
    QString activityType() const override { return type_; }
    QString activityTitle() const override { return title_; }
    bool canPerformWithActivityItems(const QVariantList& items) override {
        lastAskedItems = items;
        return canPerform_;
    }
    void prepareWithActivityItems(const QVariantList& items) override {
        preparedItems = items;
        calls.append(QStringLiteral("prepare"));
    }
    std::shared_ptr<platform::ViewController> activityViewController() override {
        calls.append(QStringLiteral("activityViewController"));
        return controller;
    }
    void performActivity() override;
    // Changes the answer of canPerform and tells the sheet, as an activity
    // that learns late does.
    void becomeAvailable(bool available) {
        canPerform_ = available;
        emit availabilityChanged();
    }

    // What performActivity does: finish at once with `completesWith`, or,
    // when it is empty, wait for the test to call activityDidFinish.
    std::optional<bool> completesWith = true;
    std::shared_ptr<platform::ViewController> controller;
    QVariantList lastAskedItems, preparedItems;
    QStringList calls;

  private:
    QString type_, title_;
    bool canPerform_;
};

// Stands for the activity sheet under the editor: records what it was given
// and how it was presented; the test ends it with finish() or cancel().
class FakeActivitySheet final : public platform::ActivityViewController {
    Q_OBJECT
  public:
    FakeActivitySheet(QVariantList items, ActivityList activities)
        : ActivityViewController(std::move(items), std::move(activities)) {}
    ActivityList offeredActivities() override { return applicationActivities(); }
    bool performActivityNamed(const QString& type) override;
    void cancel() override;
    // The user picked `type` and it ended `completed`.
    void finish(const QString& type, bool completed);

    // Every sheet made while a FakeSheets is in place.
    static QList<std::shared_ptr<FakeActivitySheet>>& made();
};

// Puts FakeActivitySheet in place of the desktop's sheet for its lifetime.
class FakeSheets {
  public:
    FakeSheets();
    ~FakeSheets();
    std::shared_ptr<FakeActivitySheet> last() const;

  private:
    platform::Implementation<platform::ActivityViewController::Maker>::Replacement replacement_;
};

class RecordingUrlOpener final : public platform::UrlOpener {
  public:
    bool accepts = true;
    QList<QUrl> opened;
    bool openURL(const QUrl& url) override {
        opened.append(url);
        return accepts;
    }
};

class FakeFileManager final : public platform::FileManagerService {
  public:
    bool answers = true;
    QList<QList<QUrl>> shown;
    void showItems(const QList<QUrl>& files, std::function<void(bool)> done) override {
        shown.append(files);
        done(answers);
    }
};

class FakeSaveLocationChooser final : public platform::SaveLocationChooser {
  public:
    QString choice; // "" cancels
    QString suggested;
    void chooseSaveLocation(QWidget*, const QString& suggestedPath,
                            std::function<void(const QString&)> done) override {
        suggested = suggestedPath;
        done(choice);
    }
};

} // namespace testing_support

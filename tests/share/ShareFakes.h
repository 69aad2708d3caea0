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
#include "support/Wait.h"

#include <QList>
#include <QUrl>

namespace testing_support {

// A fake made and put in the place of `Service` for the holder's lifetime.
template <class Service, class Fake> struct InPlace {
    std::shared_ptr<Fake> fake = std::make_shared<Fake>();
    typename platform::Implementation<typename Service::Maker>::Replacement replacement =
        Service::implementation().replace([fake = fake] { return fake; });
    Fake* operator->() const { return fake.get(); }
};

// What an asynchronous call answers: `call` starts it with the handler of
// its answer; waits on the event loop for that, nullopt when it never comes.
template <class T>
std::optional<T> awaited(const std::function<void(std::function<void(T)>)>& call,
                         int timeoutMs = 10000) {
    auto answer = std::make_shared<std::optional<T>>();
    call([answer](T value) { *answer = std::move(value); });
    waitUntil([&] { return answer->has_value(); }, timeoutMs);
    return *answer;
}

// Writes `text` to `path`, creating its folder; `executable` for scripts.
void writeText(const QString& path, const QByteArray& text, bool executable = false);

// Answers with `response` and `error` from a thread of its own, as the real
// service does; remembers the requests (read them once it has answered).
struct FakeStoreLookup final : platform::StoreLookup {
    platform::StoreLookupResponse response;
    platform::ErrorPtr error;
    QList<platform::StoreLookupRequest> requests;
    void startRequest(const platform::StoreLookupRequest& request, Callback callback) override;
};

// One item of a store answer; a null artist or link is left out.
QVariantMap storeItem(const QString& name, const QString& artist, const QString& link,
                      const QStringList& genres = {});

struct FakeExtensionRegistry final : platform::ExtensionRegistry {
    QHash<QString, bool> installed; // identifier -> enabled
    std::optional<platform::ExtensionManifest>
    extensionWithIdentifier(const QString& identifier, bool excludingDisabled) override;
};

struct FakePublishingSupport final : platform::PublishingSupport {
    bool present = false;
    bool isYouTubeSupportPresent() override { return present; }
};

// An activity whose answers a test sets; it records what the sheet did. It
// finishes at once with `completesWith`, or, when that is empty, when the
// test calls activityDidFinish.
class FakeActivity final : public platform::Activity {
    Q_OBJECT
  public:
    FakeActivity(QString type, QString title, bool canPerform = true)
        : type(std::move(type)), title(std::move(title)), canPerform(canPerform) {}
    QString activityType() const override { return type; }
    QString activityTitle() const override { return title; }
    bool canPerformWithActivityItems(const QVariantList& items) override;
    void prepareWithActivityItems(const QVariantList& items) override;
    std::shared_ptr<platform::ViewController> activityViewController() override;
    void performActivity() override;

    QString type, title;
    bool canPerform;
    std::optional<bool> completesWith = true;
    QVariantList askedItems;
    QStringList calls;
};

// Stands for the activity sheet under the editor: records what it was given
// and how it was presented; the test ends it with finish().
class FakeActivitySheet final : public platform::ActivityViewController {
    Q_OBJECT
  public:
    FakeActivitySheet(QVariantList items, ActivityList activities)
        : ActivityViewController(std::move(items), std::move(activities)) {}
    ActivityList offeredActivities() override { return applicationActivities(); }
    bool performActivityNamed(const QString& type) override;
    void cancel() override { finish(QString(), false); }
    // The user picked `type` and it ended `completed` (a null type cancels).
    void finish(const QString& type, bool completed);
};

// Puts FakeActivitySheet in place of the desktop's sheet for its lifetime.
struct FakeSheets {
    FakeSheets();
    QList<std::shared_ptr<FakeActivitySheet>> made;
    platform::Implementation<platform::ActivityViewController::Maker>::Replacement replacement;
};

// The user's browser in the desktop opener's place for its lifetime: it
// records every address it is asked to open, and takes it (Record), refuses it
// as when no browser is installed (Refuse), or loads it and follows the
// redirects (Follow), as a browser does once the user has agreed on the fake
// service's consent page, which agrees at once.
class FakeBrowser {
  public:
    enum class Behaviour { Record, Refuse, Follow };
    explicit FakeBrowser(Behaviour behaviour = Behaviour::Record);
    void setBehaviour(Behaviour behaviour);
    QList<QUrl> opened() const;
    QByteArray lastPage() const; // the body of the page a Follow ended on

  private:
    class Opener;
    std::shared_ptr<Opener> opener_;
    platform::Implementation<platform::UrlOpener::Maker>::Replacement replacement_;
};

struct FakeFileManager final : platform::FileManagerService {
    bool answers = true;
    QList<QUrl> shown;
    void showItems(const QList<QUrl>& files, std::function<void(bool)> done) override {
        shown += files;
        done(answers);
    }
};

struct FakeSaveLocationChooser final : platform::SaveLocationChooser {
    QString choice, suggested; // an empty choice cancels
    void chooseSaveLocation(QWidget*, const QString& suggestedPath,
                            std::function<void(const QString&)> done) override {
        suggested = suggestedPath;
        done(choice);
    }
};

} // namespace testing_support

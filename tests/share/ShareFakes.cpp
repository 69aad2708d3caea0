#include "ShareFakes.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QNetworkAccessManager>
#include <QNetworkReply>

#include <thread>

using namespace platform;

namespace testing_support {

void writeText(const QString& path, const QByteArray& text, bool executable) {
    QDir().mkpath(QFileInfo(path).path());
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly))
        qFatal("cannot write %s", qPrintable(path));
    file.write(text);
    if (executable)
        file.setPermissions(file.permissions() | QFile::ExeOwner);
}

void FakeStoreLookup::startRequest(const StoreLookupRequest& request, Callback callback) {
    requests.append(request);
    std::thread([callback, response = response, error = error] {
        callback(response, error);
    }).detach();
}

QVariantMap storeItem(const QString& name, const QString& artist, const QString& link,
                      const QStringList& genres) {
    QVariantMap item{{StoreItemKey::displayName, name}};
    if (!artist.isNull())
        item.insert(StoreItemKey::artistName, artist);
    if (!link.isNull())
        item.insert(StoreItemKey::shortProductURL, link);
    if (!genres.isEmpty())
        item.insert(StoreItemKey::genreNames, genres);
    return item;
}

std::optional<ExtensionManifest>
FakeExtensionRegistry::extensionWithIdentifier(const QString& identifier, bool excludingDisabled) {
    if (!installed.contains(identifier) || (excludingDisabled && !installed.value(identifier)))
        return std::nullopt;
    ExtensionManifest manifest;
    manifest.identifier = identifier;
    manifest.enabled = installed.value(identifier);
    return manifest;
}

bool FakeActivity::canPerformWithActivityItems(const QVariantList& items) {
    askedItems = items;
    return canPerform;
}

void FakeActivity::prepareWithActivityItems(const QVariantList& items) {
    calls << QStringLiteral("prepare");
    askedItems = items;
}

std::shared_ptr<ViewController> FakeActivity::activityViewController() {
    calls << QStringLiteral("activityViewController");
    return nullptr;
}

void FakeActivity::performActivity() {
    calls << QStringLiteral("perform");
    if (completesWith)
        activityDidFinish(*completesWith);
}

bool FakeActivitySheet::performActivityNamed(const QString& type) {
    finish(type, true);
    return true;
}

void FakeActivitySheet::finish(const QString& type, bool completed) {
    if (presentingViewController())
        dismissViewControllerAnimated_completion(false);
    reportCompletion(type, completed);
}

FakeSheets::FakeSheets()
    : replacement(ActivityViewController::implementation().replace(
          [this](const QVariantList& items, const ActivityViewController::ActivityList& activities)
              -> std::shared_ptr<ActivityViewController> {
              made.append(std::make_shared<FakeActivitySheet>(items, activities));
              return made.last();
          })) {}

class FakeBrowser::Opener final : public UrlOpener {
  public:
    bool openURL(const QUrl& url) override {
        opened.append(url);
        if (behaviour != Behaviour::Follow)
            return behaviour == Behaviour::Record;
        QNetworkRequest request(url);
        request.setAttribute(QNetworkRequest::RedirectPolicyAttribute,
                             QNetworkRequest::NoLessSafeRedirectPolicy);
        QNetworkReply* reply = network.get(request);
        QObject::connect(reply, &QNetworkReply::finished, reply, [this, reply] {
            lastPage = reply->readAll();
            reply->deleteLater();
        });
        return true;
    }
    Behaviour behaviour = Behaviour::Record;
    QNetworkAccessManager network;
    QList<QUrl> opened;
    QByteArray lastPage;
};

FakeBrowser::FakeBrowser(Behaviour behaviour)
    : opener_(std::make_shared<Opener>()),
      replacement_(UrlOpener::implementation().replace([opener = opener_] { return opener; })) {
    opener_->behaviour = behaviour;
}

void FakeBrowser::setBehaviour(Behaviour behaviour) {
    opener_->behaviour = behaviour;
}

QList<QUrl> FakeBrowser::opened() const {
    return opener_->opened;
}

QByteArray FakeBrowser::lastPage() const {
    return opener_->lastPage;
}

} // namespace testing_support

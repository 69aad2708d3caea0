#pragma once

// Doubles for the YouTube activity's tests: its export session, the plug-in
// loader, and the agent with the form whose members the activity reaches by
// name.

#include "platform/media/ExportSession.h"
#include "platform/publishing/PublishingAgent.h"
#include "platform/publishing/PublishingPluginLoader.h"
#include "platform/ui/ViewController.h"

#include <QList>
#include <QStringList>
#include <QVariantList>

// An export session that records how it was set up and finishes when the
// test says so (on the test's thread).
class ControlledExportSession : public platform::ExportSession {
  public:
    ControlledExportSession(std::shared_ptr<platform::Asset> asset, QString presetName)
        : asset_(std::move(asset)), preset_(std::move(presetName)) {}
    std::shared_ptr<platform::Asset> asset() const override { return asset_; }
    QString presetName() const override { return preset_; }
    QUrl outputURL() const override { return output_; }
    void setOutputURL(const QUrl& url) override { output_ = url; }
    QString outputFileType() const override { return fileType_; }
    void setOutputFileType(const QString& fileType) override { fileType_ = fileType; }
    platform::MediaTimeRange timeRange() const override { return {}; }
    void setTimeRange(const platform::MediaTimeRange&) override {}
    std::optional<platform::AudioMix> audioMix() const override { return mix_; }
    void setAudioMix(const std::optional<platform::AudioMix>& mix) override { mix_ = mix; }
    int status() const override { return status_; }
    platform::ErrorPtr error() const override { return nullptr; }
    float progress() const override { return 0; }
    void exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) override {
        handler_ = std::move(handler);
        ++starts;
    }
    void cancelExport() override { ++cancels; }
    // Ends the export with `status` and runs the handler.
    void finish(platform::ExportSessionStatus status) {
        status_ = int(status);
        std::exchange(handler_, {})();
    }

    int starts = 0, cancels = 0;

  private:
    std::shared_ptr<platform::Asset> asset_;
    QString preset_, fileType_;
    QUrl output_;
    std::optional<platform::AudioMix> mix_;
    int status_ = int(platform::ExportSessionStatus::Exporting);
    std::function<void()> handler_;
};

// Puts ControlledExportSession in the real session's place for its lifetime
// and keeps every session made.
struct ControlledExportSessions {
    QList<std::shared_ptr<ControlledExportSession>> made;
    platform::Implementation<platform::ExportSession::Maker>::Replacement replacement =
        platform::ExportSession::implementation().replace(
            [this](std::shared_ptr<platform::Asset> asset, const QString& preset) {
                made.append(std::make_shared<ControlledExportSession>(std::move(asset), preset));
                return made.last();
            });
};

// A plug-in loader that loads nothing: it answers with `agentClass` for every
// name, or fails with `loadError`; it notes what it was asked, for the whole
// process.
struct FakePluginLoader : platform::PublishingPluginLoader {
    const QMetaObject* agentClass = nullptr;
    QString loadError;
    bool isInstalled(const QString&) override { return loadError.isEmpty(); }
    bool loadExecutable(const QString& devicePath, QString* errorText) override {
        asked << "load " + devicePath;
        if (errorText)
            *errorText = loadError;
        return loadError.isEmpty();
    }
    const QMetaObject* classNamed(const QString& name) override {
        asked << "class " + name;
        return agentClass;
    }
    static inline QStringList asked;
};

class FakeFormCell : public QObject {
    Q_OBJECT
    Q_PROPERTY(QString value MEMBER value)
    Q_PROPERTY(QString placeholder MEMBER placeholder)
  public:
    explicit FakeFormCell(QString placeholder) : placeholder(std::move(placeholder)) {}
    QString value, placeholder;
};

// The upload form, which is also its own table (section 0: the title, then
// the description), category picker and cell, recording the calls these get;
// made with `hasMembers` false, it has none of them. Its own
// "_selectComedyPickerRow" (in MethodTable, under this class) only counts its
// runs; categoriesDidArrive runs whatever the class's entry holds, as the
// real form does when the categories come in.
class FakeUploadForm : public platform::ViewController {
    Q_OBJECT
    Q_PROPERTY(QObject* _table READ members)
    Q_PROPERTY(QVariantList _categories MEMBER categories)
    Q_PROPERTY(QObject* _picker READ members)
    Q_PROPERTY(QString _defaultCategory MEMBER defaultCategory)
  public:
    explicit FakeUploadForm(bool hasMembers = true);
    QObject* members() { return hasMembers_ ? this : nullptr; }
    Q_INVOKABLE QObject* _categoryCell() { return members(); }
    Q_INVOKABLE QObject* cellForRowAtIndexPath(int section, int row) {
        return section != 0 ? nullptr : row == 0 ? &title : row == 1 ? &description : nullptr;
    }
    Q_INVOKABLE void selectRow_inComponent_animated(int row, int component, bool animated) {
        calls << QStringLiteral("select %1 %2 %3").arg(row).arg(component).arg(animated);
    }
    Q_INVOKABLE void setCategoryString(const QString& category) {
        calls << QStringLiteral("category ") + category;
    }
    // The categories arrive: [{"id", "label"}] from "id:label" texts.
    void categoriesDidArrive(const QStringList& list);

    FakeFormCell title{QStringLiteral("Title")}, description{QStringLiteral("Description")};
    QStringList calls;
    QVariantList categories;
    QString defaultCategory = QStringLiteral("22");
    int ownSelections = 0;

  private:
    bool hasMembers_;
};

// A publishing agent whose navigation stack holds a FakeUploadForm; the test
// presses its buttons, which report to the delegate in the order the real
// agent does.
class FakePublishingAgent : public platform::PublishingAgent {
    Q_OBJECT
  public:
    Q_INVOKABLE FakePublishingAgent();
    // The agent made last (null when none lives), and whether the next one's
    // form has its members.
    static FakePublishingAgent* last();
    static inline bool nextFormHasMembers = true;

    void setDelegate(std::weak_ptr<platform::PublishingAgentDelegate> delegate) override {
        delegate_ = std::move(delegate);
    }
    void setMediaPath(const QString& path) override { mediaPath = path; }
    std::shared_ptr<platform::NavigationController> navigationController() override {
        return navigation_;
    }
    QString mediaURL() const override { return publishedURL; }
    std::shared_ptr<platform::PublishingAgentDelegate> delegate() const { return delegate_.lock(); }
    FakeUploadForm* form() const { return form_.get(); }

    void pressCancel() { delegate()->publishingAgentCancelButtonClicked(this); }
    void pressPublish();
    // The end of publishing, with the watch address on success.
    void endPublishing(platform::ErrorPtr error, const QString& watchURL = QString());

    QString mediaPath, publishedURL;

  private:
    std::weak_ptr<platform::PublishingAgentDelegate> delegate_;
    std::shared_ptr<FakeUploadForm> form_;
    std::shared_ptr<platform::NavigationController> navigation_;
};

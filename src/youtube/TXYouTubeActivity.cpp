#include "TXYouTubeActivity.h"

#include "platform/media/Asset.h"
#include "platform/publishing/PublishingPluginLoader.h"
#include "platform/runtime/ClassRegistry.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MethodTable.h"
#include "platform/services/PublishingPlugin.h"
#include "platform/ui/ApplicationIconImage.h"
#include "platform/ui/Device.h"
#include "platform/ui/NamedImage.h"
#include "platform/ui/Screen.h"
#include "support/FileManager.h"

#include <QDateTime>
#include <QVariantMap>

#include <mutex>

using namespace platform;

namespace {

const QByteArray kSelectComedyPickerRow("_selectComedyPickerRow");
const QString kComedyCategoryID = QStringLiteral("20");
// The class of the photo user-interface framework through which its bundle
// is found, and the activity's icon in it.
const QString kPhotoUIBundleClass = QStringLiteral("PhotoPublishingActivity");
const QString kActivityImageName = QStringLiteral("PublishVideoActivity");

// The text form of a sheet item: a link as its address, a text as it is.
QString textOf(const QVariant& item) {
    if (item.metaType() == QMetaType::fromType<QUrl>())
        return item.toUrl().toString(QUrl::FullyEncoded);
    return item.toString();
}

QObject* objectProperty(QObject* object, const char* name) {
    return object ? object->property(name).value<QObject*>() : nullptr;
}

} // namespace

std::shared_ptr<TXYouTubeActivity> TXYouTubeActivity::init() {
    // The activity's own preselection, under the name the form runs it by;
    // registered once, since a later registration would undo an exchange.
    static std::once_flag registered;
    std::call_once(registered, [] {
        MethodTable::addMethod(&staticMetaObject, kSelectComedyPickerRow,
                               [](QObject* receiver, const QVariantList&) {
                                   _selectComedyPickerRow(receiver);
                                   return QVariant();
                               });
    });
    return std::shared_ptr<TXYouTubeActivity>(new TXYouTubeActivity);
}

TXYouTubeActivity::~TXYouTubeActivity() = default;

QString TXYouTubeActivity::activityType() const {
    return QStringLiteral("TXPublishToYouTube");
}

QString TXYouTubeActivity::activityTitle() const {
    return QStringLiteral("YouTube");
}

QImage TXYouTubeActivity::activityImage() const {
    return photoUIImageNamed(kActivityImageName);
}

QImage TXYouTubeActivity::_activitySettingsImage() const {
    return ApplicationIconImage::applicationIconImageForFormat_precomposed_scale(
        activityImage(), ApplicationIconImage::Format::Small, false, Screen::mainScreen().scale());
}

ActivityCategory TXYouTubeActivity::activityCategory() const {
    return ActivityCategory::Share;
}

bool TXYouTubeActivity::canPerformWithActivityItems(const QVariantList& items) {
    return Device::deviceSupportsCapability(Device::VideoPublishingCapability);
}

std::shared_ptr<Bundle> TXYouTubeActivity::photoUIBundle() {
    static const std::shared_ptr<Bundle> bundle = Bundle::bundleForClass(kPhotoUIBundleClass);
    return bundle;
}

QImage TXYouTubeActivity::photoUIImageNamed(const QString& name) {
    const auto bundle = photoUIBundle();
    if (!bundle)
        return {};
    return NamedImage::imageNamed(name, bundle.get(), Screen::mainScreen().scale());
}

QUrl TXYouTubeActivity::tempFileURL() const {
    const QString directory =
        QStringLiteral("%1/TXCapture_YouTube").arg(FileManager::defaultManager()->_srTempPath());
    const QString seconds = QString::number(QDateTime::currentSecsSinceEpoch());
    return QUrl::fromLocalFile(directory + seconds + QStringLiteral(".mp4"));
}

void TXYouTubeActivity::prepareWithActivityItems(const QVariantList& items) {
    movieURL = tempFileURL();

    const auto asset = Asset::assetWithURL(items.value(2).toUrl());
    exportSession_ =
        ExportSession::exportSessionWithAsset_presetName(asset, ExportPresetHighestQuality);
    if (exportSession_) {
        exportSession_->setOutputURL(movieURL);
        exportSession_->setOutputFileType(FileTypeMPEG4);

        // Every audio track enters the mix as it is, so a desktop track and a
        // microphone track both reach the upload.
        AudioMix audioMix;
        for (const AssetTrack& track : asset->tracksWithMediaType(MediaType::Audio))
            audioMix.inputParameters.append(
                AudioMixInputParameters::audioMixInputParametersWithTrack(track));
        exportSession_->setAudioMix(audioMix);

        // The session keeps itself alive until its handler has run.
        ExportSession* session = exportSession_.get();
        exportSession_->exportAsynchronouslyWithCompletionHandler([session] {
            const int status = session->status();
            if (status == int(ExportSessionStatus::Failed) ||
                status == int(ExportSessionStatus::Cancelled))
                return;
            logDefault(QStringLiteral("TXYouTubeActivity: Export Mixed YouTube Video Complete."));
        });
    }

    descriptionText = QStringLiteral("%1 %2").arg(textOf(items.value(0)), textOf(items.value(1)));
}

const QMetaObject* TXYouTubeActivity::publishingAgentClass() {
    static const QMetaObject* const agentClass = [] {
        const auto loader = PublishingPluginLoader::sharedLoader();
        QString loaderError;
        if (!loader->loadExecutable(PublishingPlugin::youTubePluginPath, &loaderError))
            qFatal("%s", qPrintable(loaderError));
        const QMetaObject* found = loader->classNamed(PublishingPlugin::youTubeAgentClassName);
        if (!found)
            qFatal("Unable to find class %s", qPrintable(PublishingPlugin::youTubeAgentClassName));
        return found;
    }();
    return agentClass;
}

std::shared_ptr<ViewController> TXYouTubeActivity::activityViewController() {
    publishingAgent = ClassRegistry::makeInstance<TXPublishingAgent>(publishingAgentClass());
    if (!publishingAgent) {
        // The sheet then performs the activity, which finishes it as not
        // completed; the upload file has no one left to use it.
        logError(QStringLiteral("TXYouTubeActivity: Unable to create %1")
                     .arg(PublishingPlugin::youTubeAgentClassName));
        removeMovieFile();
        return nullptr;
    }
    publishingAgent->setDelegate(std::shared_ptr<TXPublishingAgentDelegate>(
        shared_from_this(), static_cast<TXPublishingAgentDelegate*>(this)));
    publishingAgent->setMediaPath(movieURL.path());

    const auto navigationController = publishingAgent->navigationController();
    QObject* form =
        navigationController ? navigationController->viewControllers().value(0).get() : nullptr;
    if (form)
        MethodTable::exchangeImplementations(form->metaObject(), &staticMetaObject,
                                             kSelectComedyPickerRow);

    QObject* descriptionCell = nullptr;
    if (QObject* table = objectProperty(form, "_table"))
        QMetaObject::invokeMethod(table, "cellForRowAtIndexPath", Qt::DirectConnection,
                                  Q_RETURN_ARG(QObject*, descriptionCell), Q_ARG(int, 0),
                                  Q_ARG(int, 1));
    if (descriptionCell) {
        descriptionCell->setProperty("value", descriptionText);
        descriptionCell->setProperty("placeholder", QString());
    }
    return navigationController;
}

void TXYouTubeActivity::_selectComedyPickerRow(QObject* receiver) {
    if (!receiver)
        return;
    const QVariantList categories = receiver->property("_categories").toList();
    QObject* picker = objectProperty(receiver, "_picker");
    if (categories.isEmpty())
        return;

    qsizetype index = 0;
    for (; index < categories.size(); ++index)
        if (categories[index].toMap().value(QStringLiteral("id")).toString().toLower() ==
            kComedyCategoryID)
            break;
    if (index == categories.size())
        return;

    const QVariantMap category = categories[index].toMap();
    const QString label = category.value(QStringLiteral("label")).toString();
    const QString identifier = category.value(QStringLiteral("id")).toString();
    QObject* categoryCell = nullptr;
    QMetaObject::invokeMethod(receiver, "_categoryCell", Qt::DirectConnection,
                              Q_RETURN_ARG(QObject*, categoryCell));
    if (categoryCell)
        QMetaObject::invokeMethod(categoryCell, "setCategoryString", Qt::DirectConnection,
                                  Q_ARG(QString, label));
    receiver->setProperty("_defaultCategory", QString(identifier));
    if (picker)
        QMetaObject::invokeMethod(picker, "selectRow_inComponent_animated", Qt::DirectConnection,
                                  Q_ARG(int, int(index)), Q_ARG(int, 0), Q_ARG(bool, false));
}

void TXYouTubeActivity::removeMovieFile() {
    if (exportSession_)
        exportSession_->cancelExport();
    FileManager::defaultManager()->_srRemoveFile_completion(movieURL, nullptr);
}

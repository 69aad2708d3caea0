#include "TXVideoEditorExtensionViewController.h"

#include "TXVideoEditorExtensionKeys.h"
#include "platform/hosting/ItemProvider.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <mutex>

using namespace platform;

namespace {

// The six inputs the loads fill, shared by every load of one request. Loads
// complete on worker threads, possibly at once, so the inputs take a lock.
struct InputSlots {
    std::mutex mutex;
    QString appName;
    QUrl movieURL;
    QString bundleIdentifier;
    QUrl fileAttachmentURL;
    QString shareMessage;
    QColor tintColor;
};

} // namespace

std::shared_ptr<TXVideoEditorExtensionViewController>
TXVideoEditorExtensionViewController::create() {
    return std::shared_ptr<TXVideoEditorExtensionViewController>(
        new TXVideoEditorExtensionViewController);
}

void TXVideoEditorExtensionViewController::viewDidLoad() {
    ViewController::viewDidLoad();
    setupChildViewControllers();
}

void TXVideoEditorExtensionViewController::viewWillAppear(bool animated) {
    ViewController::viewWillAppear(animated);
    if (!videoEditorViewController)
        setupVideoEditorController();
}

void TXVideoEditorExtensionViewController::viewDidDisappear(bool animated) {
    ViewController::viewDidDisappear(animated);
    logDefault(QStringLiteral("TXVideoEditorExtensionViewController -viewDidDisappear:"));
    tearDownChildViewControllers();
}

void TXVideoEditorExtensionViewController::setupChildViewControllers() {
    logDefault(QStringLiteral("TXVideoEditorExtensionViewController -setupChildViewControllers"));
    std::weak_ptr<ViewController> weak = shared_from_this();
    inputItemsFromClientWithCompletionHandler(
        [weak](QString bundleIdentifier, QString appName, QUrl movieURL, QUrl fileAttachmentURL,
               QString overrideShareMessage, QColor overrideTintColor) {
            auto controller =
                std::static_pointer_cast<TXVideoEditorExtensionViewController>(weak.lock());
            if (!controller)
                return;
            // Still on the loading thread; the controller's properties are only
            // read on the main thread, after the task below is queued.
            MainQueue::async([controller, bundleIdentifier, appName, movieURL, fileAttachmentURL,
                              overrideShareMessage, overrideTintColor] {
                controller->bundleIdentifier = bundleIdentifier;
                controller->appName = appName;
                controller->movieURL = movieURL;
                controller->fileAttachmentURL = fileAttachmentURL;
                controller->overrideShareMessage = overrideShareMessage;
                controller->overrideTintColor = overrideTintColor;
                logDefault(QStringLiteral("loaded input items"));
                controller->setupVideoEditorController();
            });
        });
}

void TXVideoEditorExtensionViewController::inputItemsFromClientWithCompletionHandler(
    InputHandler handler) {
    logDefault(QStringLiteral(
        "TXVideoEditorExtensionViewController -inputItemsFromClientWithCompletionHandler:"));
    auto inputs = std::make_shared<InputSlots>();
    const auto context = extensionContext.lock();
    if (!context)
        return;
    for (const ExtensionItem& item : context->inputItems()) {
        // A host that sends an item without attachments sends nothing with it.
        if (item.attachments.isEmpty())
            continue;
        const auto& provider = item.attachments.first();
        if (!provider->hasItemConformingToTypeIdentifier(ItemProvider::GenericDataTypeIdentifier))
            continue;
        const QString title = item.attributedTitle;
        provider->loadItemForTypeIdentifier_options_completionHandler(
            ItemProvider::GenericDataTypeIdentifier, {},
            [inputs, title, handler](QVariant value, ErrorPtr error) {
                if (error) {
                    logError(QStringLiteral("Error loading input item for type"));
                    return;
                }
                std::unique_lock lock(inputs->mutex);
                if (title == TXVideoEditorExtensionAppNameKey)
                    inputs->appName = value.toString();
                else if (title == TXVideoEditorExtensionMoviePathKey)
                    inputs->movieURL = QUrl::fromLocalFile(value.toString());
                else if (title == TXVideoEditorExtensionBundleIdentifierKey)
                    inputs->bundleIdentifier = value.toString();
                else if (title == TXVideoEditorExtensionFileAttachmentKey)
                    inputs->fileAttachmentURL = QUrl::fromLocalFile(value.toString());
                else if (title == TXVideoEditorExtensionOverrideShareMessageKey)
                    inputs->shareMessage = value.toString();
                else if (title == TXVideoEditorExtensionOverrideTintColorKey)
                    inputs->tintColor = value.value<QColor>();
                if (inputs->appName.isEmpty() || inputs->movieURL.isEmpty() ||
                    inputs->bundleIdentifier.isEmpty())
                    return;
                const auto args = std::make_tuple(inputs->bundleIdentifier, inputs->appName,
                                                  inputs->movieURL, inputs->fileAttachmentURL,
                                                  inputs->shareMessage, inputs->tintColor);
                lock.unlock();
                std::apply(handler, args);
            });
    }
}

void TXVideoEditorExtensionViewController::setupVideoEditorController() {
    videoEditorViewController =
        TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName_overrideTintColor(
            bundleIdentifier, movieURL, appName, overrideTintColor);
    videoEditorViewController->fileAttachmentURL = fileAttachmentURL;
    videoEditorViewController->overrideShareMessage = overrideShareMessage;
    videoEditorViewController->delegate =
        std::shared_ptr<TXVideoEditorViewControllerDelegate>(shared_from_this(), this);
    addChildViewController(videoEditorViewController);
    view()->addSubview(videoEditorViewController->view());
    videoEditorViewController->didMoveToParentViewController(this);
}

void TXVideoEditorExtensionViewController::tearDownChildViewControllers() {
    if (!videoEditorViewController)
        return;
    videoEditorViewController->willMoveToParentViewController(nullptr);
    View::removeFromSuperview(videoEditorViewController->view());
    videoEditorViewController->removeFromParentViewController();
    videoEditorViewController.reset();
}

void TXVideoEditorExtensionViewController::videoEditor_didFinishWithActivityTypes(
    TXVideoEditorViewController* editor, const QStringList& activityTypes) {
    logDefault(QStringLiteral(
        "TXVideoEditorExtensionViewController -videoEditorViewDidFinishWithActivityTypes:"));
    if (auto context = extensionContext.lock())
        context->extensionObjectProxy()->extensionDidFinishWithActivityTypes(activityTypes);
}

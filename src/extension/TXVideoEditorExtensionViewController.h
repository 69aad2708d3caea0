#pragma once

#include "TXVideoEditorExtensionContext.h"
#include "editor/TXVideoEditorViewController.h"
#include "platform/ui/ViewController.h"

#include <QColor>
#include <QUrl>
#include <functional>
#include <memory>

// The principal view controller of the extension: reads the host's six input
// items, shows one editor built from them as a child that fills its view, and
// forwards the editor's finish report to the host. It has no interface of its
// own. Main thread only, except the input handler (see below).
class TXVideoEditorExtensionViewController : public platform::ViewController,
                                             public TXVideoEditorViewControllerDelegate {
    Q_OBJECT
  public:
    using InputHandler = std::function<void(
        QString bundleIdentifier, QString appName, QUrl movieURL, QUrl fileAttachmentURL,
        QString overrideShareMessage, QColor overrideTintColor)>;

    static std::shared_ptr<TXVideoEditorExtensionViewController> create();

    // The request's context; set by the extension entry before the view loads.
    std::weak_ptr<TXVideoEditorExtensionContext> extensionContext;

    std::shared_ptr<TXVideoEditorViewController> videoEditorViewController;
    QString bundleIdentifier;
    QString appName;
    QUrl movieURL;
    QUrl fileAttachmentURL;
    QString overrideShareMessage;
    QColor overrideTintColor;

    void viewDidLoad() override;
    void viewWillAppear(bool animated) override;
    void viewDidDisappear(bool animated) override;
    void setupChildViewControllers();
    // Starts loading the input items; `handler` runs on a loading thread each
    // time a load completes while the three required inputs are present.
    void inputItemsFromClientWithCompletionHandler(InputHandler handler);
    void setupVideoEditorController();
    void tearDownChildViewControllers();
    void videoEditor_didFinishWithActivityTypes(TXVideoEditorViewController* editor,
                                                const QStringList& activityTypes) override;

  private:
    TXVideoEditorExtensionViewController() = default;
};

// A view whose only behaviour is that it can become the first responder.
class TXVideoEditorExtensionViewControllerFocusView : public platform::View {
    Q_OBJECT
  public:
    using platform::View::View;
    bool canBecomeFirstResponder() const { return true; }
};

#pragma once

#include "EditorKeyboard.h"
#include "extension/TXVideoEditorExtensionContext.h"
#include "extension/TXVideoEditorExtensionViewController.h"
#include "platform/hosting/ExtensionEndpoint.h"
#include "platform/ui/Window.h"

#include <QObject>
#include <memory>

// What the platform does for an extension request: it makes the context and
// the principal view controller and shows the controller in a window of its
// own, with the editor's keyboard shortcuts. The window closing, the host
// dismissing the editor and the host going away all end the request. Main
// thread only.
//
// The endpoint outlives the entry (the process's way out runs through it);
// the entry unhooks itself from it when it goes.
class ExtensionEntry : public QObject {
    Q_OBJECT
  public:
    explicit ExtensionEntry(platform::ExtensionEndpoint& endpoint);
    ~ExtensionEntry() override;

    platform::Window& window() { return window_; }
    EditorKeyboard& keyboard() { return *keyboard_; }
    const std::shared_ptr<TXVideoEditorExtensionViewController>& principal() const {
        return principal_;
    }
    const std::shared_ptr<TXVideoEditorExtensionContext>& context() const { return context_; }

    // Starts the request as if the host had sent these items.
    void beginRequest(const QList<platform::ExtensionItem>& inputItems);
    // Ends the request: the principal's view leaves the screen, queued
    // messages to the host go out, and `ended` is emitted.
    void endRequest();

  signals:
    void requestBegan();
    void ended();

  protected:
    // Closing the window is the host dismissing the editor.
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    platform::ExtensionEndpoint& endpoint_;
    platform::Window window_;
    EditorKeyboard* keyboard_; // belongs to the window
    std::shared_ptr<TXVideoEditorExtensionContext> context_;
    std::shared_ptr<TXVideoEditorExtensionViewController> principal_;
    bool ended_ = false;
};

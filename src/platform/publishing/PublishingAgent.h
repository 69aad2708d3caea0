#pragma once

#include "platform/runtime/Error.h"
#include "platform/ui/NavigationController.h"

#include <QObject>
#include <QString>

#include <memory>

namespace platform {

class PublishingAgent;

// What a publishing agent tells whoever presented it. Calls come on the main
// thread, in this order over an agent's life: willBeDisplayed once its form
// is about to show; then either cancelButtonClicked (the user gave up), or
// doneButtonClicked (the user pressed Publish) followed by didBeginPublishing
// and, exactly once, didEndPublishing with a null error on success.
class PublishingAgentDelegate {
  public:
    virtual ~PublishingAgentDelegate() = default;
    virtual void publishingAgentWillBeDisplayed(PublishingAgent* agent) = 0;
    virtual void publishingAgentDoneButtonClicked(PublishingAgent* agent) = 0;
    virtual void publishingAgentCancelButtonClicked(PublishingAgent* agent) = 0;
    virtual void publishingAgentDidBeginPublishing(PublishingAgent* agent) = 0;
    virtual void publishingAgentDidEndPublishing_error(PublishingAgent* agent, ErrorPtr error) = 0;
};

// The publishing plug-in's agent: signs the user in, shows the upload form on
// its navigation stack and publishes the file at the media path.
//
// Made by name through ClassRegistry (the plug-in registers its class when it
// is loaded) with the plain Q_INVOKABLE constructor. Main thread only. The
// delegate is held weakly.
//
// The form (the first controller of the navigation stack) can be read by name
// through Qt's meta-object system, so an activity can pre-fill it without
// linking to the plug-in:
//   property "_table"            QObject*: the form's table; Q_INVOKABLE
//                                QObject* cellForRowAtIndexPath(int section, int row)
//                                gives a cell (section 0: row 0 the title, row 1
//                                the description) whose properties "value" and
//                                "placeholder" (QString) are writable;
//   property "_categories"       QVariantList of QVariantMap, each with "id" and
//                                "label" (QString), in the picker's order;
//   property "_picker"           QObject*: the category picker; Q_INVOKABLE
//                                void selectRow_inComponent_animated(int row,
//                                int component, bool animated);
//   property "_defaultCategory"  QString, writable: the category id to publish in;
//   Q_INVOKABLE QObject* _categoryCell(): the cell showing the category, with
//                                Q_INVOKABLE void setCategoryString(QString);
//   operation "_selectComedyPickerRow": run through MethodTable (replaceable
//                                per class) whenever the categories arrive.
class PublishingAgent : public QObject {
    Q_OBJECT
  public:
    ~PublishingAgent() override = default;

    virtual void setDelegate(std::weak_ptr<PublishingAgentDelegate> delegate) = 0;
    // The file to publish (a host or device path). It may still be being
    // written when it is set: the agent sends nothing before it is complete.
    virtual void setMediaPath(const QString& path) = 0;
    virtual std::shared_ptr<NavigationController> navigationController() = 0;
    // The web address of the published video; empty until publishing succeeded.
    virtual QString mediaURL() const = 0;

  protected:
    PublishingAgent() = default;
};

} // namespace platform

#include "YouTubeFakes.h"

#include "platform/runtime/MethodTable.h"
#include "platform/ui/NavigationController.h"

#include <QPointer>

#include <mutex>

using namespace platform;

FakeUploadForm::FakeUploadForm(bool hasMembers) : hasMembers_(hasMembers) {
    static std::once_flag registered;
    std::call_once(registered, [] {
        MethodTable::addMethod(&staticMetaObject, "_selectComedyPickerRow",
                               [](QObject* receiver, const QVariantList&) {
                                   if (auto* form = qobject_cast<FakeUploadForm*>(receiver))
                                       ++form->ownSelections;
                                   return QVariant();
                               });
    });
}

void FakeUploadForm::categoriesDidArrive(const QStringList& list) {
    categories.clear();
    for (const QString& category : list)
        categories << QVariantMap{{"id", category.section(':', 0, 0)},
                                  {"label", category.section(':', 1)}};
    MethodTable::invoke(this, "_selectComedyPickerRow");
}

namespace {
QPointer<FakePublishingAgent> lastMade;
} // namespace

FakePublishingAgent::FakePublishingAgent()
    : form_(std::make_shared<FakeUploadForm>(nextFormHasMembers)),
      navigation_(NavigationController::initWithRootViewController(form_)) {
    lastMade = this;
}

FakePublishingAgent* FakePublishingAgent::last() {
    return lastMade.data();
}

void FakePublishingAgent::pressPublish() {
    delegate()->publishingAgentDoneButtonClicked(this);
    delegate()->publishingAgentDidBeginPublishing(this);
}

void FakePublishingAgent::endPublishing(ErrorPtr error, const QString& watchURL) {
    if (!error)
        publishedURL = watchURL;
    delegate()->publishingAgentDidEndPublishing_error(this, std::move(error));
}

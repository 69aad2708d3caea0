#include "SystemActivities.h"

#include "platform/ui/share/CopyToPasteboardActivity.h"
#include "platform/ui/share/MailActivity.h"
#include "platform/ui/share/MessageActivity.h"
#include "platform/ui/share/PostToFacebookActivity.h"
#include "platform/ui/share/SaveToFilesActivity.h"
#include "platform/ui/share/ShowInFolderActivity.h"

namespace platform::SystemActivities {

Implementation<Maker>& implementation() {
    static Implementation<Maker> chosen([] {
        return QList<std::shared_ptr<Activity>>{
            std::make_shared<MailActivity>(),
            std::make_shared<MessageActivity>(),
            std::make_shared<CopyToPasteboardActivity>(),
            std::make_shared<PostToFacebookActivity>(),
            std::make_shared<SaveToFilesActivity>(),
            std::make_shared<ShowInFolderActivity>(),
        };
    });
    return chosen;
}

QList<std::shared_ptr<Activity>> builtInActivities() {
    return implementation().make();
}

} // namespace platform::SystemActivities

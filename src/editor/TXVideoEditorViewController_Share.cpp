// The editor's share sheet.

#include "TXVideoEditorViewController.h"

#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"
#include "platform/services/ActivityTypes.h"
#include "platform/services/ExtensionRegistry.h"
#include "platform/services/PublishingSupport.h"
#include "platform/ui/share/ActivityViewController.h"
#include "support/BundleTXExtensions.h"
#include "support/StringFormat.h"
#include "youtube/TXStoreManager.h"
#include "youtube/TXYouTubeActivity.h"

using namespace platform;

void TXVideoEditorViewController::shareAction() {
    MainQueue::async([editor = self()] {
        // 1. The sheet, once the store has answered. Always the recording as
        // received: videoURL follows the player onto a trimmed clip once one
        // has been saved.
        editor->displayShareSheetWithVideoURL(editor->originalVideoURL);

        // 2. Done takes Cancel's place from now on; both end the editor.
        if (editor->isPadMode()) {
            Toolbar::ItemList items{editor->doneButton,  editor->flexSpace,  editor->titleButton,
                                    editor->flexSpace,   editor->playButton, editor->fixSpace,
                                    editor->shareButton, editor->fixSpace,   editor->saveButton};
            if (editor->isIntroMode())
                items.removeAll(editor->playButton);
            editor->topToolBar->setItems(items);
        } else {
            editor->topToolBar->setItems({editor->doneButton, editor->flexSpace,
                                          editor->titleButton, editor->flexSpace,
                                          editor->saveButton});
        }
    });
}

void TXVideoEditorViewController::displayShareSheetWithVideoURL(const QUrl& url) {
    // 1.
    logDefault(QStringLiteral("displayShareSheetWithVideoURL"));

    // 2.
    TXStoreManager::sharedManager()->loadItemDetailsForBundleIdentifier_completionHandler(
        bundleIdentifier, [editor = self(), url](std::shared_ptr<TXStoreInfo> storeInfo) {
            // 3. The items.
            QVariantList items;
            if (!editor->overrideShareMessage.isNull()) {
                items.append(editor->overrideShareMessage);
            } else {
                QString shareText;
                if (storeInfo->author.value_or(QString()).length() > 0)
                    shareText = stringWithFormat(
                        BundleTXExtensions::_txLocalizedStringFromFrameworkBundleWithKey_bundleID(
                            QStringLiteral("SHARE_TEXT_FORMAT"), editor->bundleIdentifier),
                        {storeInfo->appName.value_or(QString()), *storeInfo->author});
                else
                    shareText = storeInfo->appName.value_or(QStringLiteral(""));
                items.append(shareText);
                // Details without a store page give no link. The link stays
                // text: a URL would fold an "appstream:" id to lower case.
                if (!storeInfo->itemURL.value_or(QString()).isEmpty())
                    items.append(*storeInfo->itemURL);
            }
            items.append(url);
            if (!editor->fileAttachmentURL.isEmpty())
                items.append(editor->fileAttachmentURL);

            // 4. The preferred order.
            QStringList preferredOrder{MailActivityType, MessageActivityType,
                                       CopyToPasteboardActivityType, PostToFacebookActivityType};

            // 5. The platform's own YouTube activity, unless the YouTube
            // application shares through its extension.
            QList<std::shared_ptr<Activity>> applicationActivities;
            const auto youTubeExtension =
                ExtensionRegistry::sharedRegistry()->extensionWithIdentifier(
                    ExtensionRegistry::youTubeShareExtensionIdentifier, true);
            if (!youTubeExtension &&
                PublishingSupport::sharedSupport()->isYouTubeSupportPresent()) {
                auto youTube = TXYouTubeActivity::init();
                applicationActivities.append(youTube);
                preferredOrder.insert(2, youTube->activityType());
            }

            // 6. The sheet; copy stays excluded although it is preferred.
            auto sheet = ActivityViewController::initWithActivityItems_applicationActivities(
                items, applicationActivities);
            sheet->setExcludedActivityTypes({CopyToPasteboardActivityType});
            if (!applicationActivities.isEmpty())
                sheet->setPreferredActivityOrder(preferredOrder);

            // 7. Completed activities are kept for the host.
            sheet->setCompletionWithItemsHandler([editor](const QString& activityType,
                                                          bool completed, const QVariantList&,
                                                          ErrorPtr) {
                if (completed)
                    editor->activityTypes.append(activityType);
            });

            // 8.
            if (editor->isPadMode()) {
                sheet->setModalPresentationStyle(ModalPresentationStyle::Popover);
                sheet->setPopoverItem(editor->shareButton);
            } else {
                sheet->setModalPresentationStyle(ModalPresentationStyle::FullScreen);
            }
            editor->presentViewController_animated_completion(sheet, true, nullptr);
        });
}

#include "platform/publishing/YouTubeUploadClient.h"

#include "platform/runtime/ClassRegistry.h"

namespace platform {

QString YouTubeUploadClient::realClassName() {
    return QStringLiteral("YouTubeResumableUploadClient");
}

Implementation<YouTubeUploadClient::Maker>& YouTubeUploadClient::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<YouTubeUploadClient> {
        return ClassRegistry::makeInstance<YouTubeUploadClient>(
            ClassRegistry::classNamed(realClassName()));
    });
    return chosen;
}

std::shared_ptr<YouTubeUploadClient> YouTubeUploadClient::make() {
    return implementation().make();
}

} // namespace platform

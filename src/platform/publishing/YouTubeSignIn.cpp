#include "platform/publishing/YouTubeSignIn.h"

#include "platform/runtime/ClassRegistry.h"

namespace platform {

QString YouTubeSignIn::realClassName() {
    return QStringLiteral("YouTubeGoogleSignIn");
}

Implementation<YouTubeSignIn::Maker>& YouTubeSignIn::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<YouTubeSignIn> {
        return ClassRegistry::makeInstance<YouTubeSignIn>(
            ClassRegistry::classNamed(realClassName()));
    });
    return chosen;
}

std::shared_ptr<YouTubeSignIn> YouTubeSignIn::make() {
    return implementation().make();
}

} // namespace platform

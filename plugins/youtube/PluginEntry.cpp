#include "YouTubeGoogleSignIn.h"
#include "YouTubePublishingAgent.h"
#include "YouTubeResumableUploadClient.h"

#include "platform/publishing/PublishingPluginAbi.h"
#include "platform/runtime/ClassRegistry.h"

#include <mutex>
#include <type_traits>

// The loader calls this once, right after loading. Nothing is registered for a
// host of another ABI version: its loader refuses the plug-in and no class of
// it can be in use.
extern "C" __attribute__((visibility("default"))) int
tamsel_publishing_plugin_entry(int hostAbiVersion) {
    if (hostAbiVersion != TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION)
        return TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION;
    static std::once_flag registered;
    std::call_once(registered, [] {
        platform::ClassRegistry::registerClass(&YouTubePublishingAgent::staticMetaObject);
        platform::ClassRegistry::registerClass(&YouTubeGoogleSignIn::staticMetaObject);
        platform::ClassRegistry::registerClass(&YouTubeResumableUploadClient::staticMetaObject);
    });
    return TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION;
}

static_assert(
    std::is_same_v<decltype(&tamsel_publishing_plugin_entry), TamselPublishingPluginEntry>,
    "the entry point has the type the loader calls");

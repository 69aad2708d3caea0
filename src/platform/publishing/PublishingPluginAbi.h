#pragma once

// The C entry point every publishing plug-in exports. The loader calls it right
// after loading the plug-in, with the ABI version it speaks; the plug-in
// answers with the version it was built for and, only when the two agree,
// registers its classes with platform::ClassRegistry. A plug-in whose answer
// differs is refused.
//
// The ABI version changes whenever PublishingAgent, PublishingAgentDelegate,
// NavigationController or ClassRegistry change in a way a built plug-in would
// notice.

#define TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION 1
#define TAMSEL_PUBLISHING_PLUGIN_ENTRY "tamsel_publishing_plugin_entry"

extern "C" {
typedef int (*TamselPublishingPluginEntry)(int hostAbiVersion);
}

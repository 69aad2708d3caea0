// A publishing plug-in built for another ABI version: it answers with its own
// version and registers nothing unless the host speaks it.
#include "platform/publishing/PublishingPluginAbi.h"
#include "platform/runtime/ClassRegistry.h"

#include <QObject>

namespace {
class WrongAbiAgent : public QObject {
    Q_OBJECT
  public:
    Q_INVOKABLE WrongAbiAgent() = default;
};
} // namespace

extern "C" __attribute__((visibility("default"))) int
tamsel_publishing_plugin_entry(int hostAbiVersion) {
    constexpr int built = TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION + 1;
    if (hostAbiVersion == built)
        platform::ClassRegistry::registerClass(&WrongAbiAgent::staticMetaObject);
    return built;
}

#include "WrongAbiPlugin.moc"

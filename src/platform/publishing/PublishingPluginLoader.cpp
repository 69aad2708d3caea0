#include "platform/publishing/PublishingPluginLoader.h"

#include "platform/publishing/PublishingPluginAbi.h"
#include "platform/runtime/ClassRegistry.h"
#include "platform/runtime/DevicePaths.h"

#include <QFile>
#include <QFileInfo>
#include <QSet>

#include <dlfcn.h>

namespace platform {

namespace {

class DynamicPluginLoader final : public PublishingPluginLoader {
  public:
    bool isInstalled(const QString& devicePath) override {
        return QFileInfo(DevicePaths::toHost(devicePath)).isFile();
    }

    bool loadExecutable(const QString& devicePath, QString* errorText) override {
        const QString hostPath = DevicePaths::toHost(devicePath);
        if (loaded_.contains(hostPath))
            return true;
        void* handle = dlopen(QFile::encodeName(hostPath).constData(), RTLD_NOW | RTLD_LOCAL);
        if (!handle)
            return fail(errorText, QString::fromLocal8Bit(dlerror()));
        auto entry = reinterpret_cast<TamselPublishingPluginEntry>(
            dlsym(handle, TAMSEL_PUBLISHING_PLUGIN_ENTRY));
        if (!entry) {
            const QString why = QString::fromLocal8Bit(dlerror());
            dlclose(handle);
            return fail(errorText, why);
        }
        const int version = entry(TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION);
        if (version != TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION) {
            // Its classes were not registered, so nothing of it is in use.
            dlclose(handle);
            return fail(errorText, QStringLiteral("%1: plug-in ABI version %2, expected %3")
                                       .arg(hostPath)
                                       .arg(version)
                                       .arg(TAMSEL_PUBLISHING_PLUGIN_ABI_VERSION));
        }
        loaded_.insert(hostPath);
        return true;
    }

    const QMetaObject* classNamed(const QString& name) override {
        return ClassRegistry::classNamed(name);
    }

  private:
    static bool fail(QString* errorText, const QString& why) {
        if (errorText)
            *errorText = why;
        return false;
    }

    QSet<QString> loaded_;
};

} // namespace

Implementation<PublishingPluginLoader::Maker>& PublishingPluginLoader::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<PublishingPluginLoader> {
        static const auto loader = std::make_shared<DynamicPluginLoader>();
        return loader;
    });
    return chosen;
}

std::shared_ptr<PublishingPluginLoader> PublishingPluginLoader::sharedLoader() {
    return implementation().make();
}

} // namespace platform

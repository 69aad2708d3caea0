#pragma once

#include "platform/runtime/Implementation.h"

#include <QMetaObject>
#include <QString>

#include <memory>

namespace platform {

// Loads publishing plug-ins and finds the classes they register.
//
// Main thread only. A loaded plug-in stays loaded for the life of the process.
class PublishingPluginLoader {
  public:
    virtual ~PublishingPluginLoader() = default;

    // Whether a plug-in file is installed at `devicePath` (nothing is loaded).
    virtual bool isInstalled(const QString& devicePath) = 0;

    // Loads the plug-in at `devicePath` resolving every symbol at once, then
    // checks its entry point's ABI version, which registers its classes. On
    // failure returns false with the loader's error text in `errorText`. A
    // plug-in loaded before loads again at no cost.
    virtual bool loadExecutable(const QString& devicePath, QString* errorText) = 0;

    // The class registered under `name`, or null.
    virtual const QMetaObject* classNamed(const QString& name) = 0;

    // The loader from implementation(): dlopen and ClassRegistry, unless a test
    // replaced it.
    static std::shared_ptr<PublishingPluginLoader> sharedLoader();
    using Maker = std::shared_ptr<PublishingPluginLoader>();
    static Implementation<Maker>& implementation();
};

} // namespace platform

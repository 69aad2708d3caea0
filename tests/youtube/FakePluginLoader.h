#pragma once

#include "platform/publishing/PublishingPluginLoader.h"

#include <QStringList>
#include <atomic>

// A plug-in loader that loads nothing: it answers with the class it was given
// (for every name) or with a loader error, and counts, for the whole process,
// how often it was asked.
class FakePluginLoader : public platform::PublishingPluginLoader {
  public:
    FakePluginLoader(const QMetaObject* agentClass, QString loadError = QString())
        : agentClass_(agentClass), loadError_(std::move(loadError)) {}

    bool isInstalled(const QString&) override { return loadError_.isEmpty(); }
    bool loadExecutable(const QString& devicePath, QString* errorText) override {
        ++loads;
        loadedPaths.append(devicePath);
        if (!loadError_.isEmpty() && errorText)
            *errorText = loadError_;
        return loadError_.isEmpty();
    }
    const QMetaObject* classNamed(const QString& name) override {
        lookedUp.append(name);
        return agentClass_;
    }

    static inline std::atomic<int> loads = 0;
    static inline QStringList loadedPaths;
    static inline QStringList lookedUp;

  private:
    const QMetaObject* agentClass_;
    QString loadError_;
};

// Puts a FakePluginLoader in the real loader's place for its lifetime.
class FakePluginLoaderInPlace {
  public:
    explicit FakePluginLoaderInPlace(const QMetaObject* agentClass, QString loadError = QString())
        : replacement_(platform::PublishingPluginLoader::implementation().replace(
              [loader = std::make_shared<FakePluginLoader>(agentClass, std::move(loadError))] {
                  return std::static_pointer_cast<platform::PublishingPluginLoader>(loader);
              })) {}

  private:
    platform::Implementation<platform::PublishingPluginLoader::Maker>::Replacement replacement_;
};

#pragma once

#include "platform/runtime/Implementation.h"

#include <QString>

#include <memory>
#include <optional>

namespace platform {

// An installed extension as its manifest describes it.
struct ExtensionManifest {
    QString identifier;
    QString name;
    QString point; // what it extends: "share", "editor" ...
    bool enabled = true;
    QString path; // the manifest's host path
};

// The extensions installed on this desktop, found by identifier.
//
// The real registry reads manifests, "<identifier>.json" files holding a JSON
// object with "identifier", "name", "point" and "enabled" (true when left
// out), from the "tamsel/extensions" folders of $XDG_DATA_HOME and then of
// $XDG_DATA_DIRS. The first manifest of an identifier wins, so a user turns
// a system extension off with a manifest of their own that says
// "enabled": false. Read on every call; any thread.
class ExtensionRegistry {
  public:
    virtual ~ExtensionRegistry() = default;

    // The installed extension with that identifier, or nullopt; a disabled
    // one counts as absent when `excludingDisabled`.
    virtual std::optional<ExtensionManifest> extensionWithIdentifier(const QString& identifier,
                                                                     bool excludingDisabled) = 0;

    // The identifier of the YouTube application's own share extension.
    static inline const QString youTubeShareExtensionIdentifier =
        QStringLiteral("com.youtube.desktop.ShareExtension");

    static std::shared_ptr<ExtensionRegistry> sharedRegistry();
    using Maker = std::shared_ptr<ExtensionRegistry>();
    static Implementation<Maker>& implementation();
};

} // namespace platform

#pragma once

#include <QString>

namespace platform {

// Where the platform's YouTube publishing plug-in lives (a device path) and
// the name under which it registers its publishing agent's class. The share
// sheet offers publishing only when the plug-in is installed there.
namespace PublishingPlugin {

inline const QString youTubePluginPath =
    QStringLiteral("/System/Library/Publishing/libtamsel-youtube-publishing.so");
inline const QString youTubeAgentClassName = QStringLiteral("YouTubePublishingAgent");

} // namespace PublishingPlugin
} // namespace platform

#pragma once

#include <QString>
#include <QUrl>

namespace platform {

// The system speaks of device paths ("/private/var/mobile/...",
// "/System/..."); this is the one place that maps them onto the host's file
// system. Every service that takes a path or a URL goes through it.
//
//   /private/var/mobile/  ->  $TAMSEL_MOBILE_ROOT, else $XDG_DATA_HOME/tamsel/mobile/
//   /System/              ->  $TAMSEL_SYSTEM_ROOT, else the resources next to the
//                             executable (<prefix>/share/tamsel/System/), else the
//                             build tree's, else the installed prefix's
//
// Any other path is a host path and passes unchanged. The environment is read
// on every call, so tests can point the roots at temporary directories.
namespace DevicePaths {

QString mobileRoot(); // host directory, no trailing slash
QString systemRoot(); // host directory, no trailing slash

// Device path to host path. "" stays "".
QString toHost(const QString& path);

// Host path to device path: the inverse of toHost for paths under one of the
// roots, unchanged otherwise.
QString toDevice(const QString& hostPath);

// Makes the folders every device has ("/private/var/mobile/Library"), the
// way a freshly set-up device has them. The applications call it at start.
void prepareDevice();

// The host path of a file URL (empty for a URL that is not a local file).
QString hostPathOfUrl(const QUrl& url);

} // namespace DevicePaths
} // namespace platform

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
//
// A device path never leads out of its root, whatever the system code put in
// it: ".." steps stop at the root, and a NUL (which would cut the host path
// short) becomes U+2400. The framework's temporary store,
// "/private/var/mobile/Library/Tamsel", holds files only: whatever follows it
// in a path is the name of one entry of it, "/" and all. So "AC/DC_1.mp4"
// there is the one file "AC∕DC_1.mp4" (a division slash), "../x" the file
// "..∕x", and a name too long for the file system is shortened to one
// that keeps its beginning, a digest of the whole and its end. The mapping is
// idempotent: a host name read back from a listing maps to itself.
namespace DevicePaths {

QString mobileRoot(); // host directory, no trailing slash
QString systemRoot(); // host directory, no trailing slash

// Device path to host path, confined as above. "" stays "".
QString toHost(const QString& path);

// The longest entry name, in UTF-8 bytes, that a confined folder gets; room
// is left for the temporary names that writers derive from it.
inline constexpr int MaximumEntryNameBytes = 200;

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

#pragma once

namespace platform {

// True when the process runs in a Flatpak or Snap sandbox, where other
// programs are reached through the XDG desktop portals only. Any thread.
bool isSandboxed();

} // namespace platform

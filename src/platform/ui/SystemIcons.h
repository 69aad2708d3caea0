#pragma once

#include <QIcon>
#include <QString>

namespace platform {

// Icons of the toolbar's system items: the desktop icon theme's icon by its
// freedesktop name when the theme has one, else a glyph drawn here in black
// on transparent (toolbars tint it). Main thread only (QIcon).
namespace SystemIcons {

enum class Glyph { Play, Pause, Share, Undo };

QString themeName(Glyph glyph);
QIcon drawnIcon(Glyph glyph);
QIcon icon(Glyph glyph);

} // namespace SystemIcons
} // namespace platform

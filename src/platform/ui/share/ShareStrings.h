#pragma once

#include <QColor>
#include <QImage>
#include <QString>
#include <QStringList>

namespace platform {

// The sheet's own texts, from the framework bundle's "Localizable" table in
// the user's language, and its icons, from the desktop's icon theme. Any
// thread for the texts; main thread for the icons.
namespace ShareStrings {

// The text for `key`; `fallback` when the framework has none.
QString text(const char* key, const char* fallback);

// What a drawn icon shows when the desktop's theme has none.
enum class Glyph { Initial, Mail, Phone, Copy, Facebook, Save, Folder };

// The theme's icon of the first of `themeNames` it has, at the sheet's icon
// size and the screen's scale; else `glyph` drawn white on a tile of `tint`
// (Initial: the title's first letter).
QImage icon(const QStringList& themeNames, const QString& title, const QColor& tint,
            Glyph glyph = Glyph::Initial);

} // namespace ShareStrings
} // namespace platform

#pragma once

#include <QString>

// True when `name` begins with `prefix`, compared without regard to letter
// case or diacritic marks ("ÁBC_1.mp4" begins with "abc").
bool beginsWithIgnoringCaseAndDiacritics(const QString& name, const QString& prefix);

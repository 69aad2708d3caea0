#pragma once

#include <QImage>
#include <QString>

// Names of the overlay's two mask images in the framework bundle, and the
// alphas and grey of the buttons.
extern const QString TXVideoOverlayGlyphMaskImageName;      // "TXVideoOverlayGlyphMask"
extern const QString TXVideoOverlayBackgroundMaskImageName; // "TXVideoOverlayBackgroundMask"
extern const float TXVideoOverlayDefaultGlyphAlpha;         // 0.3
extern const float TXVideoOverlayHighlightedGlyphAlpha;     // 0.5
extern const float TXVideoOverlayFlatBackgroundWhite;       // 0.96
extern const float TXVideoOverlayFlatBackgroundAlpha;       // 0.96

// One of the overlay's images from the bundle of the overlay's own code (the
// framework bundle), at the main screen's scale; null when it is missing.
QImage TXVideoOverlayImageNamed(const QString& name);

// The buttons' accessible name: the framework's "PLAY" text in the user's
// language.
QString TXVideoOverlayAccessibleName();

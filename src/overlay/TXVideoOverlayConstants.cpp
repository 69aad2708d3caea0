#include "overlay/TXVideoOverlayConstants.h"

#include "platform/ui/NamedImage.h"
#include "platform/ui/Screen.h"
#include "support/BundleTXExtensions.h"

const QString TXVideoOverlayGlyphMaskImageName = QStringLiteral("TXVideoOverlayGlyphMask");
const QString TXVideoOverlayBackgroundMaskImageName =
    QStringLiteral("TXVideoOverlayBackgroundMask");
const float TXVideoOverlayDefaultGlyphAlpha = 0.3f;
const float TXVideoOverlayHighlightedGlyphAlpha = 0.5f;
const float TXVideoOverlayFlatBackgroundWhite = 0.96f;
const float TXVideoOverlayFlatBackgroundAlpha = 0.96f;

QImage TXVideoOverlayImageNamed(const QString& name) {
    const auto bundle = BundleTXExtensions::_txFrameworkBundle();
    return platform::NamedImage::imageNamed(name, bundle.get(),
                                            platform::Screen::mainScreen().scale());
}

QString TXVideoOverlayAccessibleName() {
    const auto bundle = BundleTXExtensions::_txFrameworkBundle();
    return bundle ? bundle->localizedStringForKey(QStringLiteral("PLAY"), QStringLiteral("Play"),
                                                  QStringLiteral("Localizable"))
                  : QStringLiteral("Play");
}

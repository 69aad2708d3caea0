#include "overlay/ViewSRExtensions.h"

#include "overlay/TXFlatVideoOverlayButton.h"
#include "overlay/TXHighFidelityVideoOverlayButton.h"
#include "platform/ui/Device.h"

namespace ViewSRExtensions {

TXVideoOverlayButton* _srVideoOverlayButtonWithStyle(long style) {
    bool flat = false;
    if (style == 2)
        flat = true;
    else if (style == 0)
        flat = platform::Device::graphicsQuality() == 10;
    if (flat)
        return new TXFlatVideoOverlayButton(style);
    return new TXHighFidelityVideoOverlayButton(style);
}

} // namespace ViewSRExtensions

#pragma once

#include "overlay/TXVideoOverlayButton.h"

// Button helpers that the SR group adds to the toolkit's view class.
namespace ViewSRExtensions {

// A new overlay play button of `style`: the flat one for style 2, and for
// style 0 when the device's graphics quality is 10 (software rendering);
// the high-fidelity one otherwise. The caller owns it until it is added to a
// view. Main thread only.
TXVideoOverlayButton* _srVideoOverlayButtonWithStyle(long style);

} // namespace ViewSRExtensions

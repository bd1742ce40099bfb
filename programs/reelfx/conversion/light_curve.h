// Pictures whose values are proportional to light, as OpenEXR has them. The effects are made for values as a screen
// shows them, so such pictures are converted by sRGB's curve and back. Below 0 the curve continues in a straight line,
// above 1 as it is.
#pragma once

#include "programs/reelfx/conversion/picture_view.h"

namespace velmora::hosts {

// `light` has floats, `display` samples of any type; alpha is kept. The pictures have one size.
void DisplayOfLight(const ConstPictureView& light, const PictureView& display);
// The other way: `light` has floats.
void LightOfDisplay(const ConstPictureView& display, const PictureView& light);

}  // namespace velmora::hosts

// A round knob as pixels, antialiased at any size.
#pragma once

#include <cstdint>

#include "programs/reelview/base/knob_colours.h"
#include "programs/reelview/base/picture.h"

namespace velmora::reelview {

struct KnobLook {
    double value = 0.0;   // 0..1
    double origin = 0.0;  // where the coloured arc starts: 0, or where the displayed value is 0
    bool hasFocus = false, isEnabled = true;
};

// `side` is the square's width in pixels, at least 8.
[[nodiscard]] Picture DrawKnob(std::int32_t side, const KnobLook& look, const KnobColours& colours);

}  // namespace velmora::reelview

// The widths of the glow's blurs.
#pragma once

#include "render/glow_kernels.h"

namespace velmora::render {

// The filters of the glow layer's pyramid, in its levels 0, 2 and 4.
struct GlowLayerTaps {
    GlowTaps narrow, middle, wide;
};

// For a glow layer whose cells are `cell` pixels wide. The filters leave out the blur that reducing, halving and
// doubling add anyway.
[[nodiscard]] GlowLayerTaps MakeGlowLayerTaps(double height, double cell) noexcept;

}  // namespace velmora::render

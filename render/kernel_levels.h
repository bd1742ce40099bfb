// The tables of the levels that this build has, each in its own file.
#pragma once

#include "render/kernels.h"

namespace velmora::render {

extern const Kernels kSse2Kernels;
extern const Kernels kSsse3Kernels;
extern const Kernels kAvx2Kernels;
extern const Kernels kAvx512Kernels;

// Kernels that higher levels share, since longer vectors would not speed them up: a scratch is only a few pixels wide,
// and the glow layer is a quarter of the picture.
void DrawScratchesSse2(const ScratchLine* lines, std::uint32_t count, Bgra* row, std::int32_t width,
                       const ScratchRowPlace& place) noexcept;
extern const GlowKernels kAvx2Glow;
void SplitGlowAvx2(const std::uint16_t* near, const std::uint16_t* far, std::uint16_t* const planes[3],
                   std::int32_t count, std::int16_t share) noexcept;

}  // namespace velmora::render

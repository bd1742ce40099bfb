// The kernels with AVX2.

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <span>
#include <type_traits>

#include "render/glow_kernels.h"
#include "render/scratch_line.h"
#include "render/kernels.h"
#include "render/simd/target.h"
#include "render/ycbcr.h"

#if VM_HAS_AVX2
VM_BEGIN_TARGET("avx2")

namespace velmora::render {
namespace {

#include "render/simd/avx2.h"

#include "render/simd/rows.inc"
#include "render/simd/wear.inc"
#include "render/simd/tone_lines.inc"
#include "render/simd/channels.inc"
#include "render/simd/mix.inc"
#include "render/simd/mix_channels.inc"
#include "render/simd/table_shuffles.inc"
#include "render/simd/glow_channels.inc"
#include "render/simd/tone_channels.inc"
#include "render/simd/glow.inc"
#include "render/simd/glow_split.inc"
#include "render/simd/ycbcr.inc"

}  // namespace

void SplitGlowAvx2(ConstCellRow near, ConstCellRow far, std::uint16_t* const planes[3], std::int32_t count,
                   std::int16_t share) noexcept {
    SplitCells(near, far, planes, count, share);
}

namespace {
constexpr GlowedTone kGlowedTone = {SplitGlowAvx2, ToneUnderGlow};
}  // namespace

const GlowKernels kAvx2Glow = kGlow;

const Kernels kAvx2Kernels = {ToneRow,   WearRow,    DrawScratchesSse2, CopyRow,     StreamRow,
                              EndStream, &kAvx2Glow, &kYcbcr,           &kGlowedTone};

}  // namespace velmora::render

VM_END_TARGET
#endif

// The kernels with AVX-512.

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

#if VM_HAS_AVX512
VM_BEGIN_TARGET("avx512f,avx512bw,avx512vl,avx512vbmi")

namespace velmora::render {
namespace {

#include "render/simd/avx512.h"

#include "render/simd/rows.inc"
#include "render/simd/wear.inc"
#include "render/simd/tone_lines.inc"
#include "render/simd/channels.inc"
#include "render/simd/mix.inc"
#include "render/simd/mix_channels.inc"
#include "render/simd/table_permutes.inc"
#include "render/simd/glow_channels.inc"
#include "render/simd/tone_channels.inc"
#include "render/simd/ycbcr.inc"

constexpr GlowedTone kGlowedTone = {SplitGlowAvx2, ToneUnderGlow};

}  // namespace

const Kernels kAvx512Kernels = {ToneRow,   WearRow,    DrawScratchesSse2, CopyRow,     StreamRow,
                                EndStream, &kAvx2Glow, &kYcbcr,           &kGlowedTone};

}  // namespace velmora::render

VM_END_TARGET
#endif

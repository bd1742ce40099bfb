// The kernels with SSSE3.

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <span>
#include <type_traits>

#include "render/glow_kernels.h"
#include "render/kernels.h"
#include "render/simd/target.h"
#include "render/ycbcr.h"

#if VM_HAS_SSSE3
VM_BEGIN_TARGET("ssse3")

namespace velmora::render {
namespace {

#include "render/simd/ssse3.h"

#include "render/simd/rows.inc"
#include "render/simd/wear.inc"
#if defined(__i386__)
constexpr auto* ToneRow = ToneRowSse2;
#else
#include "render/simd/tone_lines.inc"
#include "render/simd/mix.inc"
#include "render/simd/channels.inc"
#include "render/simd/mix_channels.inc"
#include "render/simd/tone_words.inc"
#endif
#include "render/simd/glow.inc"
#include "render/simd/ycbcr.inc"

}  // namespace

const Kernels kSsse3Kernels = {ToneRow,         WearRow, CopyRow, StreamRow, EndStream,
                               &kSse2Scratches, &kGlow,  &kYcbcr, nullptr};

}  // namespace velmora::render

VM_END_TARGET
#endif

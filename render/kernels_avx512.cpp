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

// Table lookups by byte permutations of 128 entries each, which are faster than computing any line.

constexpr int kTogether = 1;
constexpr bool kComputesLines = false;

inline Vec LookUp(Vec bytes, const ByteTable& table) noexcept {
    const std::uint8_t* entries = table.data();
    const Vec low = _mm512_permutex2var_epi8(Load(entries), bytes, Load(entries + 64));
    const Vec high = _mm512_permutex2var_epi8(Load(entries + 128), bytes, Load(entries + 192));
    return _mm512_mask_blend_epi8(_mm512_movepi8_mask(bytes), low, high);
}

inline void LookUpAll(Block (&b)[kTogether], const ChannelTables& tables) noexcept {
    b[0].v[0] = LookUp(b[0].v[0], tables.blue);
    b[0].v[1] = LookUp(b[0].v[1], tables.green);
    b[0].v[2] = LookUp(b[0].v[2], tables.red);
}

#include "render/simd/glow_channels.inc"
#include "render/simd/tone_channels.inc"
#include "render/simd/ycbcr.inc"

constexpr GlowedTone kGlowedTone = {SplitGlowAvx2, ToneUnderGlow};

}  // namespace

const Kernels kAvx512Kernels = {ToneRow,         WearRow,    CopyRow, StreamRow,    EndStream,
                                &kSse2Scratches, &kAvx2Glow, &kYcbcr, &kGlowedTone, kMasks};

}  // namespace velmora::render

VM_END_TARGET
#endif

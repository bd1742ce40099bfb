// The kernels with SSE2.

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <span>
#include <type_traits>

#include "render/glow_kernels.h"
#include "render/scratch_span.h"
#include "render/kernels.h"
#include "render/simd/target.h"
#include "render/ycbcr.h"

#if VM_HAS_SSE2
VM_BEGIN_TARGET("sse2")

namespace velmora::render {
namespace {

#include "render/simd/sse2.h"

#include "render/simd/rows.inc"
#include "render/simd/wear.inc"
#include "render/simd/tone_lines.inc"
#include "render/simd/mix.inc"

// Lines and the saturation mix on interleaved pixels: blue and red in one vector of 16-bit numbers, green and alpha in
// another.

template <typename Lines, typename Mixer>
inline Vec MixVector(Vec pixels, const Lines& lines, const Mixer& mixer) noexcept {
    constexpr std::int32_t kBlueRed = 30 | 76 << 16, kGreen = 149;
    const Vec blueRed = lines.At(ShiftLeft16<8>(pixels)), greenAlpha = lines.At(Upper(pixels));
    const Vec sum = Add32(MulAdd16(ShiftRightU16<8>(blueRed), All32(kBlueRed)),
                          MulAdd16(ShiftRightU16<8>(greenAlpha), All32(kGreen)));
    const Vec luma = Upper(sum);
    const Vec shared = MulHighU16(Or(luma, ShiftLeft32<16>(luma)), mixer.share);
    const Vec white = All16(255);
    const Vec even = Min16(mixer.Mixed(blueRed, shared), white);
    const Vec odd = Min16(mixer.Mixed(greenAlpha, shared), white);
    const Vec alpha = All32(static_cast<std::int32_t>(0xFF000000u));
    return Select(alpha, pixels, Or(even, ShiftLeft16<8>(odd)));
}

template <typename Lines, typename Mixer>
inline void MixPixels(const Bgra* in, Bgra* out, std::int32_t count, const Lines& lines,
                      const Mixer& mixer) noexcept {
    ForEachVector(in, out, count, [&](Vec pixels) { return MixVector(pixels, lines, mixer); });
}

#include "render/simd/tone_words.inc"
#include "render/simd/glow.inc"
#include "render/simd/ycbcr.inc"
#include "render/scratch_rows.inc"
#include "render/simd/scratches.inc"

}  // namespace

const ScratchKernels kSse2Scratches = {FindLines, DrawLines};

void ToneRowSse2(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    ToneRow(in, out, width, tone);
}

const Kernels kSse2Kernels = {ToneRow,         WearRow, CopyRow, StreamRow, EndStream,
                              &kSse2Scratches, &kGlow,  &kYcbcr, nullptr};

}  // namespace velmora::render

VM_END_TARGET
#endif

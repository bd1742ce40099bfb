// The glow's inner loops with AVX2, four cells or pixels at a time.
#include "render/glow_kernels.h"

#include <immintrin.h>

// From here on only: what the standard headers define must stay fit for every processor.
#pragma GCC target("avx2")

namespace velmora::render {
namespace {

struct Lanes {
    static constexpr std::int32_t kCells = 4;
    static constexpr std::int32_t kSize = kCells * kCellLanes;

    __m256i v;

    static Lanes All(std::int32_t value) noexcept { return {_mm256_set1_epi16(static_cast<short>(value))}; }
    static Lanes Load(ConstCellRow cells) noexcept {
        return {_mm256_loadu_si256(reinterpret_cast<const __m256i*>(cells))};
    }
};

Lanes operator+(Lanes a, Lanes b) noexcept {
    return {_mm256_add_epi16(a.v, b.v)};
}
Lanes operator-(Lanes a, Lanes b) noexcept {
    return {_mm256_sub_epi16(a.v, b.v)};
}
Lanes SaturatingSum(Lanes a, Lanes b) noexcept {
    return {_mm256_adds_epu16(a.v, b.v)};
}
Lanes SaturatingDifference(Lanes a, Lanes b) noexcept {
    return {_mm256_subs_epu16(a.v, b.v)};
}
Lanes MulHigh(Lanes a, Lanes b) noexcept {
    return {_mm256_mulhi_epu16(a.v, b.v)};
}
Lanes MulHighSigned(Lanes a, Lanes b) noexcept {
    return {_mm256_mulhi_epi16(a.v, b.v)};
}
Lanes Mean(Lanes a, Lanes b) noexcept {
    return {_mm256_avg_epu16(a.v, b.v)};
}
template <int bits>
Lanes ShiftLeft(Lanes a) noexcept {
    return {_mm256_slli_epi16(a.v, bits)};
}
template <int bits>
Lanes ShiftRight(Lanes a) noexcept {
    return {_mm256_srli_epi16(a.v, bits)};
}

void Store(CellRow cells, Lanes a) noexcept {
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(cells), a.v);
}
Lanes Approached(Lanes near, Lanes far, Lanes share) noexcept {
    return near + MulHighSigned(far - near, share);
}

// What screening adds, of `rest` × 256, in the low bytes.
Lanes Added(Lanes rest, Lanes layer, Lanes dither) noexcept {
    return ShiftRight<7>(MulHigh(rest, layer) + ShiftRight<kDitherShift>(dither));
}

// In all four lanes of each cell.
Lanes Luma(Lanes a) noexcept {
    const __m256i weights = _mm256_set1_epi64x(kLumaBlue | kLumaGreen << 16 | std::int64_t{kLumaRed} << 32);
    const __m256i halves = _mm256_madd_epi16(a.v, weights);
    const __m256i sums = _mm256_add_epi32(halves, _mm256_shuffle_epi32(halves, _MM_SHUFFLE(2, 3, 0, 1)));
    const __m256i luma = _mm256_srli_epi32(sums, 8);
    return {_mm256_or_si256(luma, _mm256_slli_epi32(luma, 16))};
}

// The glow layer over eight pixels: over 0, 1, 4 and 5 and over 2, 3, 6 and 7, as bytes unpack in both halves.
constexpr std::int32_t kScreenPixels = 8;
struct GlowLayer {
    Lanes low, high;
};

GlowLayer LoadLayer(ConstCellRow cells) noexcept {
    const __m256i first = Lanes::Load(cells).v, second = Lanes::Load(cells + Lanes::kSize).v;
    return {{_mm256_permute2x128_si256(first, second, 0x20)},
            {_mm256_permute2x128_si256(first, second, 0x31)}};
}

// Over four pixels under one cell: 3/8 and 1/8 of the way to the cell before, as far to the one behind. Then
// over the next four.
GlowLayer SpreadLayer(ConstCellRow cell) noexcept {
    constexpr long long kFar = 0x6000600060006000, kNear = 0x2000200020002000;
    const Lanes lowShares = {_mm256_setr_epi64x(kFar, kNear, kFar, kNear)};
    const Lanes highShares = {_mm256_setr_epi64x(kNear, kFar, kNear, kFar)};
    const __m256i cells = Lanes::Load(cell - kCellLanes).v;
    const Lanes near = {_mm256_permute4x64_epi64(cells, _MM_SHUFFLE(2, 2, 1, 1))};
    return {Approached(near, {_mm256_permute4x64_epi64(cells, _MM_SHUFFLE(1, 1, 0, 0))}, lowShares),
            Approached(near, {_mm256_permute4x64_epi64(cells, _MM_SHUFFLE(3, 3, 2, 2))}, highShares)};
}

GlowLayer DitherOver(std::uint16_t first) noexcept {
    constexpr long long kOfPixel = 0x0001000100010001;
    const Lanes pixels = {_mm256_setr_epi64x(0, kOfPixel, 4 * kOfPixel, 5 * kOfPixel)};
    const Lanes low = Lanes::All(first) + Lanes{_mm256_mullo_epi16(pixels.v, Lanes::All(kDitherStep).v)};
    return {low, low + Lanes::All(2 * kDitherStep)};
}

// The layer's fourth number is 0, so alpha stays as it is.
void ScreenPixels(const Bgra* in, Bgra* out, const GlowLayer& layer, const GlowLayer& dither) noexcept {
    const __m256i pixels = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in));
    const __m256i rest = _mm256_xor_si256(pixels, _mm256_set1_epi8(-1));
    const Lanes low = Added({_mm256_unpacklo_epi8(_mm256_setzero_si256(), rest)}, layer.low, dither.low);
    const Lanes high = Added({_mm256_unpackhi_epi8(_mm256_setzero_si256(), rest)}, layer.high, dither.high);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out),
                        _mm256_add_epi8(pixels, _mm256_packus_epi16(low.v, high.v)));
}

void AverageBlocks(const Bgra* const rows[4], CellRow cells, std::int32_t count) noexcept {
    const __m256i lowBytes = _mm256_set1_epi16(0xFF), noAlpha = _mm256_set1_epi32(0xFF);
    std::int32_t i = 0;
    for (; i + 2 <= count; i += 2, cells += 2 * kCellLanes) {
        __m256i blueRed = _mm256_setzero_si256(), green = _mm256_setzero_si256();
        for (int y = 0; y < 4; ++y) {
            const __m256i pixels = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(rows[y] + i * 4));
            blueRed = _mm256_add_epi16(blueRed, _mm256_and_si256(pixels, lowBytes));
            green = _mm256_add_epi16(green, _mm256_and_si256(_mm256_srli_epi16(pixels, 8), noAlpha));
        }
        const __m256i pairs =
            _mm256_add_epi16(_mm256_unpacklo_epi16(blueRed, green), _mm256_unpackhi_epi16(blueRed, green));
        const __m256i sums =
            _mm256_slli_epi16(_mm256_add_epi16(pairs, _mm256_unpackhi_epi64(pairs, pairs)), 3);
        const __m256i both = _mm256_permute4x64_epi64(sums, _MM_SHUFFLE(3, 1, 2, 0));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(cells), _mm256_castsi256_si128(both));
    }
    const Bgra* const rest[4] = {rows[0] + i * 4, rows[1] + i * 4, rows[2] + i * 4, rows[3] + i * 4};
    kPlainGlowKernels.averageBlocks(rest, cells, count - i);
}

// Neighbouring cells across the halves of a vector cost more than they bring: SSE2's loops serve here.
void HalveAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept {
    kSse2GlowKernels.halveAlong(row, out, count);
}
void DoubleAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept {
    kSse2GlowKernels.doubleAlong(row, out, count);
}

#include "render/glow_kernels_vector.inc"

}  // namespace

const GlowKernels kAvx2GlowKernels = kKernels;

}  // namespace velmora::render

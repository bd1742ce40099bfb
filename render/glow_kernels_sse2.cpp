// The glow's inner loops with SSE2, two cells or pixels at a time.
#include "render/glow_kernels.h"

#include <emmintrin.h>

namespace velmora::render {
namespace {

struct Lanes {
    static constexpr std::int32_t kCells = 2;
    static constexpr std::int32_t kSize = kCells * kCellLanes;

    __m128i v;

    static Lanes All(std::int32_t value) noexcept { return {_mm_set1_epi16(static_cast<short>(value))}; }
    static Lanes Load(ConstCellRow cells) noexcept {
        return {_mm_loadu_si128(reinterpret_cast<const __m128i*>(cells))};
    }
    static Lanes Pair(ConstCellRow first, ConstCellRow second) noexcept {
        return {_mm_unpacklo_epi64(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(first)),
                                   _mm_loadl_epi64(reinterpret_cast<const __m128i*>(second)))};
    }
    static Lanes Repeat(ConstCellRow cell) noexcept { return Pair(cell, cell); }
};

Lanes operator+(Lanes a, Lanes b) noexcept {
    return {_mm_add_epi16(a.v, b.v)};
}
Lanes operator-(Lanes a, Lanes b) noexcept {
    return {_mm_sub_epi16(a.v, b.v)};
}
Lanes SaturatingSum(Lanes a, Lanes b) noexcept {
    return {_mm_adds_epu16(a.v, b.v)};
}
Lanes SaturatingDifference(Lanes a, Lanes b) noexcept {
    return {_mm_subs_epu16(a.v, b.v)};
}
Lanes MulHigh(Lanes a, Lanes b) noexcept {
    return {_mm_mulhi_epu16(a.v, b.v)};
}
Lanes MulHighSigned(Lanes a, Lanes b) noexcept {
    return {_mm_mulhi_epi16(a.v, b.v)};
}
Lanes Mean(Lanes a, Lanes b) noexcept {
    return {_mm_avg_epu16(a.v, b.v)};
}
template <int bits>
Lanes ShiftLeft(Lanes a) noexcept {
    return {_mm_slli_epi16(a.v, bits)};
}
template <int bits>
Lanes ShiftRight(Lanes a) noexcept {
    return {_mm_srli_epi16(a.v, bits)};
}

void Store(CellRow cells, Lanes a) noexcept {
    _mm_storeu_si128(reinterpret_cast<__m128i*>(cells), a.v);
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
    const __m128i weights =
        _mm_setr_epi16(kLumaBlue, kLumaGreen, kLumaRed, 0, kLumaBlue, kLumaGreen, kLumaRed, 0);
    const __m128i halves = _mm_madd_epi16(a.v, weights);
    const __m128i sums = _mm_add_epi32(halves, _mm_shuffle_epi32(halves, _MM_SHUFFLE(2, 3, 0, 1)));
    const __m128i luma = _mm_srli_epi32(sums, 8);
    return {_mm_or_si128(luma, _mm_slli_epi32(luma, 16))};
}

// The glow layer over the first and the last two of four pixels.
constexpr std::int32_t kScreenPixels = 4;
struct GlowLayer {
    Lanes low, high;
};

GlowLayer LoadLayer(ConstCellRow cells) noexcept {
    return {Lanes::Load(cells), Lanes::Load(cells + Lanes::kSize)};
}

// Over four pixels under one cell: 3/8 and 1/8 of the way to the cell before, as far to the one behind.
GlowLayer SpreadLayer(ConstCellRow cell) noexcept {
    constexpr short kFar = 24576, kNear = 8192;
    const Lanes lowShares = {_mm_setr_epi16(kFar, kFar, kFar, kFar, kNear, kNear, kNear, kNear)};
    const Lanes highShares = {_mm_setr_epi16(kNear, kNear, kNear, kNear, kFar, kFar, kFar, kFar)};
    const Lanes near = Lanes::Repeat(cell);
    return {Approached(near, Lanes::Repeat(cell - kCellLanes), lowShares),
            Approached(near, Lanes::Repeat(cell + kCellLanes), highShares)};
}

GlowLayer DitherOver(std::uint16_t first) noexcept {
    constexpr auto kNext = static_cast<short>(kDitherStep);
    const Lanes low = Lanes::All(first) + Lanes{_mm_setr_epi16(0, 0, 0, 0, kNext, kNext, kNext, kNext)};
    return {low, low + Lanes::All(2 * kDitherStep)};
}

// The layer's fourth number is 0, so alpha stays as it is.
void ScreenPixels(const Bgra* in, Bgra* out, const GlowLayer& layer, const GlowLayer& dither) noexcept {
    const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in));
    const __m128i rest = _mm_xor_si128(pixels, _mm_set1_epi8(-1));
    const Lanes low = Added({_mm_unpacklo_epi8(_mm_setzero_si128(), rest)}, layer.low, dither.low);
    const Lanes high = Added({_mm_unpackhi_epi8(_mm_setzero_si128(), rest)}, layer.high, dither.high);
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out), _mm_add_epi8(pixels, _mm_packus_epi16(low.v, high.v)));
}

void AverageBlocks(const Bgra* const rows[4], CellRow cells, std::int32_t count) noexcept {
    const __m128i lowBytes = _mm_set1_epi16(0xFF), noAlpha = _mm_set1_epi32(0xFF);
    for (std::int32_t i = 0; i < count; ++i, cells += kCellLanes) {
        __m128i blueRed = _mm_setzero_si128(), green = _mm_setzero_si128();
        for (int y = 0; y < 4; ++y) {
            const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(rows[y] + i * 4));
            blueRed = _mm_add_epi16(blueRed, _mm_and_si128(pixels, lowBytes));
            green = _mm_add_epi16(green, _mm_and_si128(_mm_srli_epi16(pixels, 8), noAlpha));
        }
        const __m128i pairs =
            _mm_add_epi16(_mm_unpacklo_epi16(blueRed, green), _mm_unpackhi_epi16(blueRed, green));
        const __m128i sum = _mm_add_epi16(pairs, _mm_unpackhi_epi64(pairs, pairs));
        _mm_storel_epi64(reinterpret_cast<__m128i*>(cells), _mm_slli_epi16(sum, 3));
    }
}

void HalveAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept;
void DoubleAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept;

#include "render/glow_kernels_vector.inc"

void HalveAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count; i += 2, row += 4 * kCellLanes, out += 2 * kCellLanes) {
        const auto every2nd = [row](std::int32_t from) {
            return Lanes::Pair(row + from * kCellLanes, row + (from + 2) * kCellLanes);
        };
        Store(out, ThreeToOne(Mean(every2nd(0), every2nd(1)), Mean(every2nd(-1), every2nd(2))));
    }
}

void DoubleAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count; ++i, row += kCellLanes, out += 2 * kCellLanes) {
        Store(out, ThreeToOne(Lanes::Repeat(row), Lanes::Pair(row - kCellLanes, row + kCellLanes)));
    }
}

}  // namespace

const GlowKernels kSse2GlowKernels = kKernels;

}  // namespace velmora::render

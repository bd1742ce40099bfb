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
    static Lanes LoadPixels(const Bgra* pixels) noexcept {
        return {_mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(pixels)))};
    }
    static __m128i Twice(ConstCellRow cell) noexcept {
        const __m128i single = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(cell));
        return _mm_unpacklo_epi64(single, single);
    }
    // For four pixels under one cell: the cell, the cells on either side of it, and the way towards those.
    static Lanes Repeat(ConstCellRow cell) noexcept { return {_mm256_broadcastsi128_si256(Twice(cell))}; }
    static Lanes Neighbours(ConstCellRow cell, int) noexcept {
        return {_mm256_inserti128_si256(_mm256_castsi128_si256(Twice(cell - kCellLanes)),
                                        Twice(cell + kCellLanes), 1)};
    }
    static Lanes NeighbourShares(int) noexcept {
        constexpr short kFar = 24576, kNear = 8192;
        return {_mm256_setr_epi16(kFar, kFar, kFar, kFar, kNear, kNear, kNear, kNear,  //
                                  kNear, kNear, kNear, kNear, kFar, kFar, kFar, kFar)};
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
Lanes MulLow(Lanes a, Lanes b) noexcept {
    return {_mm256_mullo_epi16(a.v, b.v)};
}
Lanes Mean(Lanes a, Lanes b) noexcept {
    return {_mm256_avg_epu16(a.v, b.v)};
}
Lanes Min(Lanes a, Lanes b) noexcept {
    return {_mm256_min_epi16(a.v, b.v)};
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
void StorePixels(Bgra* pixels, Lanes a) noexcept {
    const __m128i packed = _mm_packus_epi16(_mm256_castsi256_si128(a.v), _mm256_extracti128_si256(a.v, 1));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(pixels), packed);
}

// In all four lanes of each cell.
Lanes Luma(Lanes a) noexcept {
    const __m256i weights = _mm256_set1_epi64x(kLumaBlue | kLumaGreen << 16 | std::int64_t{kLumaRed} << 32);
    const __m256i halves = _mm256_madd_epi16(a.v, weights);
    const __m256i sums = _mm256_add_epi32(halves, _mm256_shuffle_epi32(halves, _MM_SHUFFLE(2, 3, 0, 1)));
    const __m256i luma = _mm256_srli_epi32(sums, 8);
    return {_mm256_or_si256(luma, _mm256_slli_epi32(luma, 16))};
}

// In the lanes of blue, green and red.
Lanes BrightestChannel(Lanes a) noexcept {
    const __m256i next =
        _mm256_broadcastsi128_si256(_mm_setr_epi8(2, 3, 4, 5, 0, 1, 6, 7, 10, 11, 12, 13, 8, 9, 14, 15));
    const __m256i other =
        _mm256_broadcastsi128_si256(_mm_setr_epi8(4, 5, 0, 1, 2, 3, 6, 7, 12, 13, 8, 9, 10, 11, 14, 15));
    return {_mm256_max_epi16(
        a.v, _mm256_max_epi16(_mm256_shuffle_epi8(a.v, next), _mm256_shuffle_epi8(a.v, other)))};
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

#include "render/glow_kernels_vector.h"

}  // namespace

const GlowKernels kAvx2GlowKernels = kKernels;

}  // namespace velmora::render

// 32-byte forms. Every function that holds wide values carries the target itself: nothing else in the
// program may be compiled for a processor that might not be there.

#include <immintrin.h>

#include <cstring>

#include "render/kernels.h"

#define VM_AVX2 __attribute__((target("avx2")))

namespace velmora::render {
namespace {

// As in the 16-byte form, four pixels at a time.
VM_AVX2 inline __m256i MixFour(__m256i channels, __m256i luma, __m256i u) noexcept {
    const __m256i products = _mm256_madd_epi16(channels, luma);
    const __m256i sum =
        _mm256_srli_epi32(_mm256_add_epi32(products, _mm256_shuffle_epi32(products, 0xB1)), 8);
    const __m256i grey = _mm256_or_si256(sum, _mm256_slli_epi32(sum, 16));
    const __m256i away = _mm256_mullo_epi16(_mm256_sub_epi16(channels, grey), u);
    const __m256i scaled = _mm256_sub_epi16(_mm256_slli_epi16(channels, 7), channels);
    return _mm256_srai_epi16(_mm256_adds_epi16(scaled, away), 7);
}

VM_AVX2 void MixRow(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept {
    const __m256i zero = _mm256_setzero_si256();
    const __m256i luma = _mm256_set1_epi64x(0x0000004C0095001E);  // 30, 149, 76, 0
    const __m256i u = _mm256_set1_epi16(static_cast<short>(-weight));
    const __m256i alpha = _mm256_set1_epi32(static_cast<int>(0xFF000000u));
    std::int32_t x = 0;
    for (; x + 8 <= width; x += 8) {
        const __m256i pixels = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x));
        const __m256i mixed = _mm256_packus_epi16(MixFour(_mm256_unpacklo_epi8(pixels, zero), luma, u),
                                                  MixFour(_mm256_unpackhi_epi8(pixels, zero), luma, u));
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + x), _mm256_blendv_epi8(mixed, pixels, alpha));
    }
    kSse2Kernels.mix(in + x, out + x, width - x, weight);
}

// Two pixels, as in the 16-byte form.
VM_AVX2 inline __m256i Lighten(__m128i pixels, __m256 fraction) noexcept {
    const __m256i channels = _mm256_cvtepu8_epi32(pixels);
    const __m256 product =
        _mm256_mul_ps(fraction, _mm256_cvtepi32_ps(_mm256_sub_epi32(_mm256_set1_epi32(255), channels)));
    const __m256i whole = _mm256_cvttps_epi32(product);
    const __m256 rest = _mm256_sub_ps(product, _mm256_cvtepi32_ps(whole));
    const __m256i up = _mm256_castps_si256(_mm256_cmp_ps(rest, _mm256_set1_ps(0.5f), _CMP_GE_OQ));
    return _mm256_add_epi32(channels, _mm256_sub_epi32(whole, up));
}

VM_AVX2 void WearRow(const Bgra* in, Bgra* out, std::int32_t width, const std::uint8_t* bytes,
                     const float* fractions) noexcept {
    const __m256 colour = _mm256_castsi256_ps(_mm256_setr_epi32(-1, -1, -1, 0, -1, -1, -1, 0));
    const __m256i firstTwo = _mm256_setr_epi32(0, 0, 0, 0, 1, 1, 1, 1);
    const __m256i lastTwo = _mm256_setr_epi32(2, 2, 2, 2, 3, 3, 3, 3);
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        std::uint32_t worn;
        std::memcpy(&worn, bytes + x, sizeof worn);
        __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x));
        if (worn != 0) {
            const __m256 four =
                _mm256_castps128_ps256(_mm_setr_ps(fractions[bytes[x]], fractions[bytes[x + 1]],
                                                   fractions[bytes[x + 2]], fractions[bytes[x + 3]]));
            const __m256i low =
                Lighten(pixels, _mm256_and_ps(colour, _mm256_permutevar8x32_ps(four, firstTwo)));
            const __m256i high = Lighten(_mm_srli_si128(pixels, 8),
                                         _mm256_and_ps(colour, _mm256_permutevar8x32_ps(four, lastTwo)));
            // Packing works in halves: pixel 0 and 2 come first, 1 and 3 behind.
            const __m256i words = _mm256_packs_epi32(low, high);
            const __m256i packed = _mm256_packus_epi16(words, words);
            pixels = _mm_unpacklo_epi32(_mm256_castsi256_si128(packed), _mm256_extracti128_si256(packed, 1));
        }
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), pixels);
    }
    kPlainKernels.wear(in + x, out + x, width - x, bytes + x, fractions);
}

VM_AVX2 void CopyRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    std::int32_t x = 0;
    for (; x + 16 <= width; x += 16) {
        const __m256i first = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x));
        const __m256i second = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x + 8));
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + x), first);
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + x + 8), second);
    }
    kPlainKernels.copy(in + x, out + x, width - x);
}

}  // namespace

const RowKernels kAvx2Kernels = {TablesRowByWords, MixRow, WearRow, CopyRow};

}  // namespace velmora::render

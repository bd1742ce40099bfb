// 16-byte forms. Also the table look-up that the wider forms without byte permutations use: words loaded
// whole and three look-ups, which beats in-register shuffles over 256 entries.

#include <emmintrin.h>

#include <cstring>

#include "render/kernels.h"

namespace velmora::render {
namespace {

std::uint32_t LookUp(std::uint32_t pixel, const ChannelTables& t) noexcept {
    return t.blueWord[pixel & 0xFFu] | t.greenWord[(pixel >> 8) & 0xFFu] | t.redWord[(pixel >> 16) & 0xFFu] |
           (pixel & 0xFF000000u);
}

}  // namespace

void TablesRowByWords(const Bgra* in, Bgra* out, std::int32_t width, const ChannelTables& tables) noexcept {
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        std::uint64_t pair[2];
        std::memcpy(pair, in + x, sizeof pair);
        for (std::uint64_t& two : pair) {
            const auto low = static_cast<std::uint32_t>(two), high = static_cast<std::uint32_t>(two >> 32);
            two = LookUp(low, tables) | std::uint64_t{LookUp(high, tables)} << 32;
        }
        std::memcpy(out + x, pair, sizeof pair);
    }
    kPlainKernels.tables(in + x, out + x, width - x, tables);
}

namespace {

// 16-bit channels of two pixels: 127 X + u (X - Y) with u = -w, saturating where the result is above white
// anyway.
__m128i MixTwo(__m128i channels, __m128i luma, __m128i u) noexcept {
    const __m128i products = _mm_madd_epi16(channels, luma);
    const __m128i sum = _mm_srli_epi32(_mm_add_epi32(products, _mm_shuffle_epi32(products, 0xB1)), 8);
    const __m128i grey = _mm_or_si128(sum, _mm_slli_epi32(sum, 16));
    const __m128i away = _mm_mullo_epi16(_mm_sub_epi16(channels, grey), u);
    const __m128i scaled = _mm_sub_epi16(_mm_slli_epi16(channels, 7), channels);
    return _mm_srai_epi16(_mm_adds_epi16(scaled, away), 7);
}

void MixRow(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept {
    const __m128i zero = _mm_setzero_si128();
    const __m128i luma = _mm_setr_epi16(30, 149, 76, 0, 30, 149, 76, 0);
    const __m128i u = _mm_set1_epi16(static_cast<short>(-weight));
    const __m128i colour = _mm_set1_epi32(0x00FFFFFF);
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x));
        const __m128i mixed = _mm_packus_epi16(MixTwo(_mm_unpacklo_epi8(pixels, zero), luma, u),
                                               MixTwo(_mm_unpackhi_epi8(pixels, zero), luma, u));
        const __m128i kept = _mm_or_si128(_mm_and_si128(colour, mixed), _mm_andnot_si128(colour, pixels));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), kept);
    }
    kPlainKernels.mix(in + x, out + x, width - x, weight);
}

// One pixel, its channels as 32-bit numbers: c + R(a (255 - c)). The product's part behind the point is
// exact, so comparing it with a half rounds halves up as the plain form does.
__m128i Lighten(__m128i channels, __m128 fraction) noexcept {
    const __m128 product =
        _mm_mul_ps(fraction, _mm_cvtepi32_ps(_mm_sub_epi32(_mm_set1_epi32(255), channels)));
    const __m128i whole = _mm_cvttps_epi32(product);
    const __m128 rest = _mm_sub_ps(product, _mm_cvtepi32_ps(whole));
    const __m128i up = _mm_castps_si128(_mm_cmpge_ps(rest, _mm_set1_ps(0.5f)));  // -1 where rounded up
    return _mm_add_epi32(channels, _mm_sub_epi32(whole, up));
}

// A lane's fraction for the channels of its pixel; alpha's is 0.
template <int kLane>
__m128 PixelFraction(__m128 fractions) noexcept {
    const __m128 colour = _mm_castsi128_ps(_mm_setr_epi32(-1, -1, -1, 0));
    return _mm_and_ps(colour, _mm_shuffle_ps(fractions, fractions, kLane * 0x55));
}

void WearRow(const Bgra* in, Bgra* out, std::int32_t width, const std::uint8_t* bytes,
             float amount) noexcept {
    const __m128i zero = _mm_setzero_si128();
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        std::int32_t worn;
        std::memcpy(&worn, bytes + x, sizeof worn);
        if (worn == 0 && in == out) continue;
        __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x));
        if (worn != 0) {
            const __m128i wide = _mm_unpacklo_epi16(_mm_unpacklo_epi8(_mm_cvtsi32_si128(worn), zero), zero);
            const __m128 fractions =
                _mm_mul_ps(_mm_div_ps(_mm_cvtepi32_ps(wide), _mm_set1_ps(255.0f)), _mm_set1_ps(amount));
            const __m128i low = _mm_unpacklo_epi8(pixels, zero), high = _mm_unpackhi_epi8(pixels, zero);
            const __m128i first = Lighten(_mm_unpacklo_epi16(low, zero), PixelFraction<0>(fractions));
            const __m128i second = Lighten(_mm_unpackhi_epi16(low, zero), PixelFraction<1>(fractions));
            const __m128i third = Lighten(_mm_unpacklo_epi16(high, zero), PixelFraction<2>(fractions));
            const __m128i fourth = Lighten(_mm_unpackhi_epi16(high, zero), PixelFraction<3>(fractions));
            pixels = _mm_packus_epi16(_mm_packs_epi32(first, second), _mm_packs_epi32(third, fourth));
        }
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), pixels);
    }
    kPlainKernels.wear(in + x, out + x, width - x, bytes + x, amount);
}

}  // namespace

const RowKernels kSse2Kernels = {TablesRowByWords, MixRow, WearRow, kPlainKernels.copy};

}  // namespace velmora::render

// 4:2:2 to 32 bits and back, four pixels at a time.

#include <immintrin.h>

#include "render/ycbcr.h"

namespace velmora::render {
namespace {

using Vector = __m128i;
constexpr std::int32_t kPixels = 4;  // in a vector

Vector All32(std::int32_t value) noexcept {
    return _mm_set1_epi32(value);
}
Vector Alternating(std::int32_t even, std::int32_t odd) noexcept {
    return _mm_setr_epi32(even, odd, even, odd);
}
Vector Add32(Vector a, Vector b) noexcept {
    return _mm_add_epi32(a, b);
}
Vector Add16(Vector a, Vector b) noexcept {
    return _mm_add_epi16(a, b);
}
Vector MulAdd(Vector a, Vector b) noexcept {
    return _mm_madd_epi16(a, b);
}
Vector PackSigned(Vector a, Vector b) noexcept {
    return _mm_packs_epi32(a, b);
}
Vector PackUnsigned(Vector a, Vector b) noexcept {
    return _mm_packus_epi16(a, b);
}
Vector And(Vector a, Vector b) noexcept {
    return _mm_and_si128(a, b);
}
Vector Or(Vector a, Vector b) noexcept {
    return _mm_or_si128(a, b);
}
template <int bits>
Vector ShiftLeft16(Vector a) noexcept {
    return _mm_slli_epi16(a, bits);
}
template <int bits>
Vector ShiftRight32(Vector a) noexcept {
    return _mm_srai_epi32(a, bits);
}
// Of each four 16-bit numbers.
template <int a, int b, int c, int d>
Vector Words(Vector v) noexcept {
    return _mm_shufflehi_epi16(_mm_shufflelo_epi16(v, _MM_SHUFFLE(d, c, b, a)), _MM_SHUFFLE(d, c, b, a));
}
Vector EvenWords(Vector a, Vector b) noexcept {
    return _mm_castps_si128(
        _mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
}
Vector OddWords(Vector a, Vector b) noexcept {
    return _mm_castps_si128(
        _mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
}
Vector LeftPixels(Vector a, Vector b) noexcept {
    return _mm_unpacklo_epi64(a, b);
}
Vector RightPixels(Vector a, Vector b) noexcept {
    return _mm_unpackhi_epi64(a, b);
}
Vector LowChannels(Vector a) noexcept {
    return _mm_unpacklo_epi8(a, _mm_setzero_si128());
}
Vector HighChannels(Vector a) noexcept {
    return _mm_unpackhi_epi8(a, _mm_setzero_si128());
}
// A quarter's lower half and its upper one in turn.
Vector InterleaveBytes(Vector a) noexcept {
    return _mm_unpacklo_epi8(a, _mm_srli_si128(a, 8));
}
Vector InterleaveWords(Vector a) noexcept {
    return _mm_unpacklo_epi16(a, _mm_srli_si128(a, 8));
}
Vector LoadPixels(const Bgra* pixels) noexcept {
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(pixels));
}
void StorePixels(Bgra* pixels, Vector a) noexcept {
    _mm_storeu_si128(reinterpret_cast<__m128i*>(pixels), a);
}
// Groups of four bytes, as 16-bit numbers; half a quarter of bytes in a quarter.
Vector LoadGroups(const std::uint8_t* bytes) noexcept {
    return _mm_unpacklo_epi8(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(bytes)), _mm_setzero_si128());
}
// Of each quarter the lower half.
void StoreGroups(std::uint8_t* bytes, Vector a) noexcept {
    _mm_storel_epi64(reinterpret_cast<__m128i*>(bytes), a);
}

#include "render/ycbcr_vector.h"

}  // namespace

const YcbcrKernels kSse2YcbcrKernels = kKernels;

}  // namespace velmora::render

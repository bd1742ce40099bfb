// 4:2:2 to 32 bits and back, eight pixels at a time.

#include <immintrin.h>

#include "render/ycbcr.h"

// From here on only: what the standard headers define must stay fit for every processor.
#pragma GCC target("avx2")

namespace velmora::render {
namespace {

using Vector = __m256i;
constexpr std::int32_t kPixels = 8;  // in a vector

Vector All32(std::int32_t value) noexcept {
    return _mm256_set1_epi32(value);
}
Vector Alternating(std::int32_t even, std::int32_t odd) noexcept {
    return _mm256_setr_epi32(even, odd, even, odd, even, odd, even, odd);
}
Vector Add32(Vector a, Vector b) noexcept {
    return _mm256_add_epi32(a, b);
}
Vector Add16(Vector a, Vector b) noexcept {
    return _mm256_add_epi16(a, b);
}
Vector MulAdd(Vector a, Vector b) noexcept {
    return _mm256_madd_epi16(a, b);
}
Vector PackSigned(Vector a, Vector b) noexcept {
    return _mm256_packs_epi32(a, b);
}
Vector PackUnsigned(Vector a, Vector b) noexcept {
    return _mm256_packus_epi16(a, b);
}
Vector And(Vector a, Vector b) noexcept {
    return _mm256_and_si256(a, b);
}
Vector Or(Vector a, Vector b) noexcept {
    return _mm256_or_si256(a, b);
}
template <int bits>
Vector ShiftLeft16(Vector a) noexcept {
    return _mm256_slli_epi16(a, bits);
}
template <int bits>
Vector ShiftRight32(Vector a) noexcept {
    return _mm256_srai_epi32(a, bits);
}
// Of each four 16-bit numbers.
template <int a, int b, int c, int d>
Vector Words(Vector v) noexcept {
    return _mm256_shufflehi_epi16(_mm256_shufflelo_epi16(v, _MM_SHUFFLE(d, c, b, a)),
                                  _MM_SHUFFLE(d, c, b, a));
}
Vector EvenWords(Vector a, Vector b) noexcept {
    return _mm256_castps_si256(
        _mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
}
Vector OddWords(Vector a, Vector b) noexcept {
    return _mm256_castps_si256(
        _mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
}
Vector LeftPixels(Vector a, Vector b) noexcept {
    return _mm256_unpacklo_epi64(a, b);
}
Vector RightPixels(Vector a, Vector b) noexcept {
    return _mm256_unpackhi_epi64(a, b);
}
Vector LowChannels(Vector a) noexcept {
    return _mm256_unpacklo_epi8(a, _mm256_setzero_si256());
}
Vector HighChannels(Vector a) noexcept {
    return _mm256_unpackhi_epi8(a, _mm256_setzero_si256());
}
// A quarter's lower half and its upper one in turn.
Vector InterleaveBytes(Vector a) noexcept {
    return _mm256_unpacklo_epi8(a, _mm256_bsrli_epi128(a, 8));
}
Vector InterleaveWords(Vector a) noexcept {
    return _mm256_unpacklo_epi16(a, _mm256_bsrli_epi128(a, 8));
}
Vector LoadPixels(const Bgra* pixels) noexcept {
    return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(pixels));
}
void StorePixels(Bgra* pixels, Vector a) noexcept {
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(pixels), a);
}
// Groups of four bytes, as 16-bit numbers; half a quarter of bytes in a quarter.
Vector LoadGroups(const std::uint8_t* bytes) noexcept {
    return _mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes)));
}
// Of each quarter the lower half.
void StoreGroups(std::uint8_t* bytes, Vector a) noexcept {
    const __m256i both = _mm256_permute4x64_epi64(a, _MM_SHUFFLE(3, 1, 2, 0));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(bytes), _mm256_castsi256_si128(both));
}

#include "render/ycbcr_vector.h"

}  // namespace

const YcbcrKernels kAvx2YcbcrKernels = kKernels;

}  // namespace velmora::render

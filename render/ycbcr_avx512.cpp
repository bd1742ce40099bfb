// 4:2:2 to 32 bits and back, sixteen pixels at a time.

#include <immintrin.h>

#include "render/ycbcr.h"

// From here on only: what the standard headers define must stay fit for every processor.
#pragma GCC target("avx512f,avx512bw,avx512vl")

namespace velmora::render {
namespace {

using Vector = __m512i;
constexpr std::int32_t kPixels = 16;  // in a vector

Vector All32(std::int32_t value) noexcept {
    return _mm512_set1_epi32(value);
}
Vector Alternating(std::int32_t even, std::int32_t odd) noexcept {
    return _mm512_set1_epi64(
        static_cast<std::int64_t>(static_cast<std::uint64_t>(static_cast<std::uint32_t>(odd)) << 32 |
                                  static_cast<std::uint32_t>(even)));
}
Vector Add32(Vector a, Vector b) noexcept {
    return _mm512_add_epi32(a, b);
}
Vector Add16(Vector a, Vector b) noexcept {
    return _mm512_add_epi16(a, b);
}
Vector MulAdd(Vector a, Vector b) noexcept {
    return _mm512_madd_epi16(a, b);
}
Vector PackSigned(Vector a, Vector b) noexcept {
    return _mm512_packs_epi32(a, b);
}
Vector PackUnsigned(Vector a, Vector b) noexcept {
    return _mm512_packus_epi16(a, b);
}
Vector And(Vector a, Vector b) noexcept {
    return _mm512_and_si512(a, b);
}
Vector Or(Vector a, Vector b) noexcept {
    return _mm512_or_si512(a, b);
}
template <int bits>
Vector ShiftLeft16(Vector a) noexcept {
    return _mm512_slli_epi16(a, bits);
}
template <int bits>
Vector ShiftRight32(Vector a) noexcept {
    return _mm512_srai_epi32(a, bits);
}
// Of each four 16-bit numbers.
template <int a, int b, int c, int d>
Vector Words(Vector v) noexcept {
    return _mm512_shufflehi_epi16(_mm512_shufflelo_epi16(v, _MM_SHUFFLE(d, c, b, a)),
                                  _MM_SHUFFLE(d, c, b, a));
}
Vector EvenWords(Vector a, Vector b) noexcept {
    return _mm512_castps_si512(
        _mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
}
Vector OddWords(Vector a, Vector b) noexcept {
    return _mm512_castps_si512(
        _mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
}
Vector LeftPixels(Vector a, Vector b) noexcept {
    return _mm512_unpacklo_epi64(a, b);
}
Vector RightPixels(Vector a, Vector b) noexcept {
    return _mm512_unpackhi_epi64(a, b);
}
Vector LowChannels(Vector a) noexcept {
    return _mm512_unpacklo_epi8(a, _mm512_setzero_si512());
}
Vector HighChannels(Vector a) noexcept {
    return _mm512_unpackhi_epi8(a, _mm512_setzero_si512());
}
// A quarter's lower half and its upper one in turn.
Vector InterleaveBytes(Vector a) noexcept {
    return _mm512_unpacklo_epi8(a, _mm512_bsrli_epi128(a, 8));
}
Vector InterleaveWords(Vector a) noexcept {
    return _mm512_unpacklo_epi16(a, _mm512_bsrli_epi128(a, 8));
}
Vector LoadPixels(const Bgra* pixels) noexcept {
    return _mm512_loadu_si512(reinterpret_cast<const __m512i*>(pixels));
}
void StorePixels(Bgra* pixels, Vector a) noexcept {
    _mm512_storeu_si512(reinterpret_cast<__m512i*>(pixels), a);
}
// Groups of four bytes, as 16-bit numbers; half a quarter of bytes in a quarter.
Vector LoadGroups(const std::uint8_t* bytes) noexcept {
    return _mm512_cvtepu8_epi16(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(bytes)));
}
// Of each quarter the lower half.
void StoreGroups(std::uint8_t* bytes, Vector a) noexcept {
    const __m512i all = _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7), a);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(bytes), _mm512_castsi512_si256(all));
}

#include "render/ycbcr_vector.h"

}  // namespace

const YcbcrKernels kAvx512YcbcrKernels = kKernels;

}  // namespace velmora::render

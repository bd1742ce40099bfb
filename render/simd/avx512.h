// The vocabulary of AVX-512: vectors of four blocks. Included in the unnamed namespace of a level's file; sse2.h and
// ssse3.h say what the operations do.

using Vec = __m512i;
inline constexpr std::int32_t kBlocks = 4;
inline constexpr std::int32_t kPixels = 4 * kBlocks;

#define VM_MM(name) _mm512_##name
#define VM_WHOLE(name) _mm512_##name##_si512
#include "render/simd/x86_operations.inc"
#undef VM_MM
#undef VM_WHOLE

inline Vec Select(Vec mask, Vec a, Vec b) noexcept {
    constexpr int kChoice = 0xCA;
    return _mm512_ternarylogic_epi32(mask, a, b, kChoice);
}
inline Vec EachBlock(std::int64_t low, std::int64_t high) noexcept {
    return _mm512_set4_epi64(high, low, high, low);
}
inline Vec ShuffleBytes(Vec table, Vec indices) noexcept {
    return _mm512_shuffle_epi8(table, indices);
}

// As a byte shuffle, which takes one instruction instead of two.
template <int a, int b, int c, int d>
inline Vec Shuffle16(Vec v) noexcept {
    constexpr auto kBytesOf = [](std::int64_t word) { return word * 0x202 + 0x100; };
    constexpr std::int64_t kLow = kBytesOf(a) | kBytesOf(b) << 16 | kBytesOf(c) << 32 | kBytesOf(d) << 48;
    return ShuffleBytes(v, EachBlock(kLow, kLow + 0x0808080808080808));
}
inline Vec Even32(Vec a, Vec b) noexcept {
    return _mm512_castps_si512(
        _mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
}
inline Vec Odd32(Vec a, Vec b) noexcept {
    return _mm512_castps_si512(
        _mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
}

inline Vec Load(const void* from) noexcept {
    return _mm512_loadu_si512(from);
}
inline void Store(void* to, Vec v) noexcept {
    _mm512_storeu_si512(to, v);
}
inline __mmask16 MaskBefore(std::int32_t place) noexcept {
    return static_cast<__mmask16>((1u << place) - 1u);
}
inline Vec LoadPart(const Bgra* from, std::int32_t count) noexcept {
    return _mm512_maskz_loadu_epi32(MaskBefore(count), from);
}
inline void StorePart(Bgra* to, std::int32_t count, Vec v) noexcept {
    _mm512_mask_storeu_epi32(to, MaskBefore(count), v);
}
inline Vec LoadFrom(std::int32_t place, const void* from, Vec before) noexcept {
    return _mm512_mask_loadu_epi32(before, static_cast<__mmask16>(0xFFFFu << place), from);
}
inline void Stream(void* to, Vec v) noexcept {
    _mm512_stream_si512(static_cast<__m512i*>(to), v);
}
inline void EndStream() noexcept {
    _mm_sfence();
}
inline void StoreLow64(void* to, Vec v) noexcept {
    const __m512i all = _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7), v);
    _mm256_storeu_si256(static_cast<__m256i*>(to), _mm512_castsi512_si256(all));
}
inline Vec LoadBytes16(const void* from) noexcept {
    return _mm512_cvtepu8_epi16(_mm256_loadu_si256(static_cast<const __m256i*>(from)));
}
// As in avx2.h, with sixteen numbers.
inline Vec LoadNumbersAround(const void* from) noexcept {
    return _mm512_castsi256_si512(_mm256_loadu_si256(static_cast<const __m256i*>(from)));
}
inline Vec PickNumbers(Vec numbers, Vec places) noexcept {
    return _mm512_permutexvar_epi16(places, numbers);
}
constexpr std::uint16_t PlaceOfNumber(std::int32_t index) noexcept {
    return static_cast<std::uint16_t>(index);
}

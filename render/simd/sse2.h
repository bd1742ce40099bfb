// The vocabulary of SSE2: vectors of one block. Included in the unnamed namespace of a level's file.
// See x86_operations.inc for how operations are named.

using Vec = __m128i;
inline constexpr std::int32_t kBlocks = 1;            // of 16 bytes
inline constexpr std::int32_t kPixels = 4 * kBlocks;  // in a vector

#define VM_MM(name) _mm_##name
#define VM_WHOLE(name) _mm_##name##_si128
#include "render/simd/x86_operations.inc"
#undef VM_MM
#undef VM_WHOLE

// The bits of `a` where those of the mask are set, else those of `b`.
inline Vec Select(Vec mask, Vec a, Vec b) noexcept {
    return Or(And(mask, a), AndNot(mask, b));
}
// These two numbers in each block.
inline Vec EachBlock(std::int64_t low, std::int64_t high) noexcept {
    return _mm_set_epi64x(high, low);
}
// Each block's index in all of its 16-bit numbers.
inline Vec BlockIndex16() noexcept {
    return Zero();
}

#ifndef VM_SSSE3_SHUFFLES
// Of each four 16-bit numbers.
template <int a, int b, int c, int d>
inline Vec Shuffle16(Vec v) noexcept {
    return _mm_shufflehi_epi16(_mm_shufflelo_epi16(v, _MM_SHUFFLE(d, c, b, a)), _MM_SHUFFLE(d, c, b, a));
}
#endif
// Swaps the two 32-bit numbers of each pair.
inline Vec SwapPairs32(Vec v) noexcept {
    return _mm_shuffle_epi32(v, _MM_SHUFFLE(2, 3, 0, 1));
}
// Those of `a`, then those of `b`.
inline Vec Even32(Vec a, Vec b) noexcept {
    return _mm_castps_si128(
        _mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
}
inline Vec Odd32(Vec a, Vec b) noexcept {
    return _mm_castps_si128(
        _mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
}

// Memory needs no alignment unless stated.
inline Vec Load(const void* from) noexcept {
    return _mm_loadu_si128(static_cast<const __m128i*>(from));
}
inline void Store(void* to, Vec v) noexcept {
    _mm_storeu_si128(static_cast<__m128i*>(to), v);
}
// The first `count` pixels, fewer than a vector has. Loading sets the others to 0, storing leaves them unchanged.
inline Vec LoadPart(const Bgra* from, std::int32_t count) noexcept {
    Bgra pixels[kPixels] = {};
    std::copy(from, from + count, pixels);
    return Load(pixels);
}
inline void StorePart(Bgra* to, std::int32_t count, Vec v) noexcept {
    Bgra pixels[kPixels];
    Store(pixels, v);
    std::copy(pixels, pixels + count, to);
}
// The vector's 32-bit numbers before `place`, then those from memory.
inline Vec LoadFrom(std::int32_t place, const void* from, Vec before) noexcept {
    const Vec theirs = _mm_cmplt_epi32(_mm_setr_epi32(0, 1, 2, 3), _mm_set1_epi32(place));
    return Select(theirs, before, Load(from));
}
// Stores to an address aligned to the vector's size, bypassing the caches.
inline void Stream(void* to, Vec v) noexcept {
    _mm_stream_si128(static_cast<__m128i*>(to), v);
}
inline void EndStream() noexcept {
    _mm_sfence();
}

// All bits set where `a` is greater.
inline Vec Greater16(Vec a, Vec b) noexcept {
    return _mm_cmpgt_epi16(a, b);
}
inline Vec Greater32(Vec a, Vec b) noexcept {
    return _mm_cmpgt_epi32(a, b);
}

// 64 bits, and zeros.
inline Vec LoadLow64(const void* from) noexcept {
    return _mm_loadl_epi64(static_cast<const __m128i*>(from));
}
// Block k from `from` + k × `step` bytes.
inline Vec LoadBlocks(const void* from, std::ptrdiff_t) noexcept {
    return Load(from);
}
// Block k: 64 bits from each of `first` + k × `step` bytes and `second` + k × `step` bytes.
inline Vec LoadPairs64(const void* first, const void* second, std::ptrdiff_t) noexcept {
    return InterleaveLow64(LoadLow64(first), LoadLow64(second));
}
#ifndef VM_SSSE3_SHUFFLES
// Block k: twice the 64 bits from `from` + 8 k bytes.
inline Vec LoadTwice64(const void* from) noexcept {
    return LoadPairs64(from, from, 0);
}
#endif
// The lower halves of the blocks, one after the other.
inline void StoreLow64(void* to, Vec v) noexcept {
    _mm_storel_epi64(static_cast<__m128i*>(to), v);
}
// Bytes as 16-bit numbers.
inline Vec LoadBytes16(const void* from) noexcept {
    return InterleaveLow8(LoadLow64(from), Zero());
}

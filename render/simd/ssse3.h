// The vocabulary of SSSE3: that of SSE2, byte shuffles, and what is one instruction with them or with SSE3. Included in
// the unnamed namespace of a level's file.

#define VM_SSSE3_SHUFFLES
#include "render/simd/sse2.h"
#undef VM_SSSE3_SHUFFLES

// Looks up each block of `indices` (0..15) in the same block of `table`; 0 where an index is negative.
inline Vec ShuffleBytes(Vec table, Vec indices) noexcept {
    return _mm_shuffle_epi8(table, indices);
}
// As a byte shuffle, which takes one instruction instead of two.
template <int a, int b, int c, int d>
inline Vec Shuffle16(Vec v) noexcept {
    constexpr auto kBytesOf = [](std::int64_t word) { return word * 0x202 + 0x100; };
    constexpr std::int64_t kLow = kBytesOf(a) | kBytesOf(b) << 16 | kBytesOf(c) << 32 | kBytesOf(d) << 48;
    return ShuffleBytes(v, EachBlock(kLow, kLow + 0x0808080808080808));
}
inline Vec LoadTwice64(const void* from) noexcept {
    double number;
    std::memcpy(&number, from, sizeof number);
    return _mm_castpd_si128(_mm_loaddup_pd(&number));
}

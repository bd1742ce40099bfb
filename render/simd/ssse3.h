// What SSSE3 adds to the vocabulary of SSE2: byte shuffles.

// The bytes of each block of `table` by the indices 0..15 in that of `indices`; 0 where an index is negative.
inline Vec ShuffleBytes(Vec table, Vec indices) noexcept {
    return _mm_shuffle_epi8(table, indices);
}
// Sums of the products of two neighbours, of bytes without a sign by those with one.
inline Vec MulAddU8(Vec bytes, Vec signedBytes) noexcept {
    return _mm_maddubs_epi16(bytes, signedBytes);
}
// The bytes of `a` where those of `sign` are negative, else those of `b`.
inline Vec SelectBySign8(Vec sign, Vec a, Vec b) noexcept {
    return Select(_mm_cmplt_epi8(sign, Zero()), a, b);
}
// The same 16 bytes, at a multiple of 16, in each block.
inline Vec RepeatBlock(const void* from) noexcept {
    return _mm_load_si128(static_cast<const __m128i*>(from));
}

// What SSSE3 adds to the vocabulary of SSE2: byte shuffles.

// The bytes of each block of `table` by the indices 0..15 in that of `indices`; 0 where an index is negative.
inline Vec ShuffleBytes(Vec table, Vec indices) noexcept {
    return _mm_shuffle_epi8(table, indices);
}
// Sums of the products of two neighbours, of bytes without a sign by those with one.
inline Vec MulAddU8(Vec bytes, Vec signedBytes) noexcept {
    return _mm_maddubs_epi16(bytes, signedBytes);
}

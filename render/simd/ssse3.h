// What SSSE3 adds to the vocabulary of SSE2: byte shuffles.

// Looks up each block of `indices` (0..15) in the same block of `table`; 0 where an index is negative.
inline Vec ShuffleBytes(Vec table, Vec indices) noexcept {
    return _mm_shuffle_epi8(table, indices);
}
// Sums of two neighbouring products of unsigned by signed bytes.
inline Vec MulAddU8(Vec bytes, Vec signedBytes) noexcept {
    return _mm_maddubs_epi16(bytes, signedBytes);
}

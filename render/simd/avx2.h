// The vocabulary of AVX2: vectors of two blocks. Included in the unnamed namespace of a level's file; sse2.h and
// ssse3.h say what the operations do.

using Vec = __m256i;
inline constexpr std::int32_t kBlocks = 2;
inline constexpr std::int32_t kPixels = 4 * kBlocks;

#define VM_MM(name) _mm256_##name
#define VM_WHOLE(name) _mm256_##name##_si256
#include "render/simd/x86_operations.inc"
#undef VM_MM
#undef VM_WHOLE

// Bytewise; each byte of the mask is 0 or 255.
inline Vec Select(Vec mask, Vec a, Vec b) noexcept {
    return _mm256_blendv_epi8(b, a, mask);
}
inline Vec EachBlock(std::int64_t low, std::int64_t high) noexcept {
    return _mm256_setr_epi64x(low, high, low, high);
}
inline Vec BlockIndex16() noexcept {
    constexpr std::int64_t kOnes = 0x0001000100010001;
    return _mm256_setr_epi64x(0, 0, kOnes, kOnes);
}

inline Vec ShuffleBytes(Vec table, Vec indices) noexcept {
    return _mm256_shuffle_epi8(table, indices);
}
// As a byte shuffle, which takes one instruction instead of two.
template <int a, int b, int c, int d>
inline Vec Shuffle16(Vec v) noexcept {
    constexpr auto kBytesOf = [](std::int64_t word) { return word * 0x202 + 0x100; };
    constexpr std::int64_t kLow = kBytesOf(a) | kBytesOf(b) << 16 | kBytesOf(c) << 32 | kBytesOf(d) << 48;
    return ShuffleBytes(v, EachBlock(kLow, kLow + 0x0808080808080808));
}
inline Vec SwapPairs32(Vec v) noexcept {
    return _mm256_shuffle_epi32(v, _MM_SHUFFLE(2, 3, 0, 1));
}
inline Vec Even32(Vec a, Vec b) noexcept {
    return _mm256_castps_si256(
        _mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
}
inline Vec Odd32(Vec a, Vec b) noexcept {
    return _mm256_castps_si256(
        _mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
}

inline Vec Load(const void* from) noexcept {
    return _mm256_loadu_si256(static_cast<const __m256i*>(from));
}
inline void Store(void* to, Vec v) noexcept {
    _mm256_storeu_si256(static_cast<__m256i*>(to), v);
}
inline Vec MaskBefore(std::int32_t place) noexcept {
    return _mm256_cmpgt_epi32(_mm256_set1_epi32(place), _mm256_setr_epi32(0, 1, 2, 3, 4, 5, 6, 7));
}
inline Vec LoadPart(const Bgra* from, std::int32_t count) noexcept {
    return _mm256_maskload_epi32(reinterpret_cast<const int*>(from), MaskBefore(count));
}
inline void StorePart(Bgra* to, std::int32_t count, Vec v) noexcept {
    _mm256_maskstore_epi32(reinterpret_cast<int*>(to), MaskBefore(count), v);
}
inline Vec LoadFrom(std::int32_t place, const void* from, Vec before) noexcept {
    return Select(MaskBefore(place), before, Load(from));
}
inline void Stream(void* to, Vec v) noexcept {
    _mm256_stream_si256(static_cast<__m256i*>(to), v);
}
inline void EndStream() noexcept {
    _mm_sfence();
}

inline Vec JoinBlocks(__m128i low, __m128i high) noexcept {
    return _mm256_inserti128_si256(_mm256_castsi128_si256(low), high, 1);
}
inline Vec LoadBlocks(const void* from, std::ptrdiff_t step) noexcept {
    const char* bytes = static_cast<const char*>(from);
    return JoinBlocks(_mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes)),
                      _mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes + step)));
}
inline Vec LoadPairs64(const void* first, const void* second, std::ptrdiff_t step) noexcept {
    const auto pair = [=](std::ptrdiff_t at) {
        return _mm_unpacklo_epi64(
            _mm_loadl_epi64(reinterpret_cast<const __m128i*>(static_cast<const char*>(first) + at)),
            _mm_loadl_epi64(reinterpret_cast<const __m128i*>(static_cast<const char*>(second) + at)));
    };
    return JoinBlocks(pair(0), pair(step));
}
inline Vec LoadTwice64(const void* from) noexcept {
    const __m128i both = _mm_loadu_si128(static_cast<const __m128i*>(from));
    return _mm256_permute4x64_epi64(_mm256_castsi128_si256(both), _MM_SHUFFLE(1, 1, 0, 0));
}
inline void StoreLow64(void* to, Vec v) noexcept {
    const __m256i both = _mm256_permute4x64_epi64(v, _MM_SHUFFLE(3, 1, 2, 0));
    _mm_storeu_si128(static_cast<__m128i*>(to), _mm256_castsi256_si128(both));
}
inline Vec LoadBytes16(const void* from) noexcept {
    return _mm256_cvtepu8_epi16(_mm_loadu_si128(static_cast<const __m128i*>(from)));
}

// The bytes of `a` where those of `sign` are negative, else those of `b`.
inline Vec SelectBySign8(Vec sign, Vec a, Vec b) noexcept {
    return _mm256_blendv_epi8(b, a, sign);
}
// The same 16 bytes, at a multiple of 16, in each block.
inline Vec RepeatBlock(const void* from) noexcept {
    return _mm256_broadcastsi128_si256(_mm_load_si128(static_cast<const __m128i*>(from)));
}
// Eight 16-bit numbers, for PickNumbers.
inline Vec LoadNumbersAround(const void* from) noexcept {
    return _mm256_broadcastsi128_si256(_mm_loadu_si128(static_cast<const __m128i*>(from)));
}
// Those numbers at `places`, each of which is a PlaceOfNumber.
inline Vec PickNumbers(Vec numbers, Vec places) noexcept {
    return ShuffleBytes(numbers, places);
}
constexpr std::uint16_t PlaceOfNumber(std::int32_t index) noexcept {
    return static_cast<std::uint16_t>(index * 0x0202 + 0x0100);
}

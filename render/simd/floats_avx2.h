// Eight floats in a vector (floats_plain.h says what the functions do).

using Floats = __m256;
inline constexpr std::int32_t kFloats = 8;

inline Floats All(float x) noexcept { return _mm256_set1_ps(x); }
inline Floats Load(const float* from) noexcept { return _mm256_loadu_ps(from); }
inline void Store(float* to, Floats x) noexcept { _mm256_storeu_ps(to, x); }

inline Floats Least(Floats a, Floats b) noexcept { return _mm256_min_ps(a, b); }
inline Floats Most(Floats a, Floats b) noexcept { return _mm256_max_ps(a, b); }
// As whole numbers, for which the processor has more units.
inline Floats Unit(Floats x) noexcept {
    const __m256i positive = _mm256_max_epi32(_mm256_castps_si256(x), _mm256_setzero_si256());
    return _mm256_castsi256_ps(_mm256_min_epi32(positive, _mm256_castps_si256(All(1.0f))));
}
inline Floats NumberOr0(Floats x) noexcept { return _mm256_and_ps(_mm256_cmp_ps(x, x, _CMP_ORD_Q), x); }
inline Floats WherePositive(Floats sign, Floats x) noexcept {
    return _mm256_and_ps(_mm256_cmp_ps(sign, _mm256_setzero_ps(), _CMP_GT_OQ), x);
}

inline Floats SquareRoot(Floats x) noexcept { return _mm256_sqrt_ps(x); }
inline Floats PowerGuess(Floats x, float times, float plus) noexcept {
    const Floats bits = _mm256_cvtepi32_ps(_mm256_castps_si256(x));
    return _mm256_castsi256_ps(_mm256_cvttps_epi32(bits * All(times) + All(plus)));
}

inline constexpr std::int32_t kBitsOf1 = 0x3F800000;
using Marks = __m256i;
inline Marks NoMarks() noexcept { return _mm256_setzero_si256(); }
inline Marks Marked(Marks marks, Floats x) noexcept {
    const __m256i bits = _mm256_castps_si256(x);
    return _mm256_or_si256(marks, _mm256_or_si256(bits, _mm256_sub_epi32(_mm256_set1_epi32(kBitsOf1), bits)));
}
inline bool AreMarked(Marks marks) noexcept { return _mm256_movemask_ps(_mm256_castsi256_ps(marks)) != 0; }

// The 64-bit halves of both blocks, in the order 0 2 1 3.
inline Floats InOrder(Floats x) noexcept {
    return _mm256_castpd_ps(_mm256_permute4x64_pd(_mm256_castps_pd(x), _MM_SHUFFLE(3, 1, 2, 0)));
}
inline Floats Evens(Floats a, Floats b) noexcept {
    return InOrder(_mm256_shuffle_ps(a, b, _MM_SHUFFLE(2, 0, 2, 0)));
}
inline Floats Odds(Floats a, Floats b) noexcept {
    return InOrder(_mm256_shuffle_ps(a, b, _MM_SHUFFLE(3, 1, 3, 1)));
}
inline void StoreInTurn(float* to, Floats a, Floats b) noexcept {
    const Floats low = _mm256_unpacklo_ps(a, b), high = _mm256_unpackhi_ps(a, b);
    Store(to, _mm256_permute2f128_ps(low, high, 0x20));
    Store(to + 8, _mm256_permute2f128_ps(low, high, 0x31));
}

struct FourFloats {
    Floats a, b, c, d;
};
// Within each block.
inline FourFloats Transposed(const FourFloats& x) noexcept {
    const Floats ab = _mm256_unpacklo_ps(x.a, x.b), cd = _mm256_unpacklo_ps(x.c, x.d);
    const Floats abHigh = _mm256_unpackhi_ps(x.a, x.b), cdHigh = _mm256_unpackhi_ps(x.c, x.d);
    return {_mm256_shuffle_ps(ab, cd, _MM_SHUFFLE(1, 0, 1, 0)),
            _mm256_shuffle_ps(ab, cd, _MM_SHUFFLE(3, 2, 3, 2)),
            _mm256_shuffle_ps(abHigh, cdHigh, _MM_SHUFFLE(1, 0, 1, 0)),
            _mm256_shuffle_ps(abHigh, cdHigh, _MM_SHUFFLE(3, 2, 3, 2))};
}
// A pixel and the one four places after it.
inline Floats LoadBoth(const float* from) noexcept {
    return _mm256_insertf128_ps(_mm256_castps128_ps256(_mm_loadu_ps(from)), _mm_loadu_ps(from + 16), 1);
}
inline FourFloats LoadFours(const float* from) noexcept {
    return Transposed({LoadBoth(from), LoadBoth(from + 4), LoadBoth(from + 8), LoadBoth(from + 12)});
}
inline Floats LoadBoth(const std::uint16_t* from) noexcept {
    const __m128i low = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(from));
    const __m128i high = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(from + 16));
    return _mm256_cvtepi32_ps(_mm256_cvtepu16_epi32(_mm_unpacklo_epi64(low, high)));
}
inline FourFloats LoadFours(const std::uint16_t* from) noexcept {
    return Transposed({LoadBoth(from), LoadBoth(from + 4), LoadBoth(from + 8), LoadBoth(from + 12)});
}
inline Floats Load8(const float* from) noexcept { return Load(from); }
inline Floats Load8(const std::uint16_t* from) noexcept {
    return _mm256_cvtepi32_ps(
        _mm256_cvtepu16_epi32(_mm_loadu_si128(reinterpret_cast<const __m128i*>(from))));
}
template <typename Sample, typename Convert>
inline FourFloats SumFours(const Sample* from, Convert&& convert) noexcept {
    const auto halves = [&](int cell) {
        return convert(Load8(from + 16 * cell)) + convert(Load8(from + 16 * cell + 8));
    };
    const auto sums = [&](int cell) {
        const Floats low = halves(cell), high = halves(cell + 4);
        return _mm256_permute2f128_ps(low, high, 0x20) + _mm256_permute2f128_ps(low, high, 0x31);
    };
    return Transposed({sums(0), sums(1), sums(2), sums(3)});
}
inline FourFloats InPixelOrder(const FourFloats& x) noexcept {
    const FourFloats pixels = Transposed(x);
    return {_mm256_permute2f128_ps(pixels.a, pixels.b, 0x20), _mm256_permute2f128_ps(pixels.c, pixels.d, 0x20),
            _mm256_permute2f128_ps(pixels.a, pixels.b, 0x31), _mm256_permute2f128_ps(pixels.c, pixels.d, 0x31)};
}
inline void StoreFours(float* to, const FourFloats& x) noexcept {
    const FourFloats pixels = InPixelOrder(x);
    Store(to, pixels.a);
    Store(to + 8, pixels.b);
    Store(to + 16, pixels.c);
    Store(to + 24, pixels.d);
}
inline void StreamFours(float* to, const FourFloats& x) noexcept {
    const FourFloats pixels = InPixelOrder(x);
    _mm256_stream_ps(to, pixels.a);
    _mm256_stream_ps(to + 8, pixels.b);
    _mm256_stream_ps(to + 16, pixels.c);
    _mm256_stream_ps(to + 24, pixels.d);
}
inline void EndStream() noexcept { _mm_sfence(); }
inline void StoreFours(std::uint16_t* to, const FourFloats& x) noexcept {
    const FourFloats pixels = Transposed(x);
    const __m256i first = _mm256_packus_epi32(_mm256_cvttps_epi32(pixels.a), _mm256_cvttps_epi32(pixels.b));
    const __m256i second = _mm256_packus_epi32(_mm256_cvttps_epi32(pixels.c), _mm256_cvttps_epi32(pixels.d));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(to), _mm256_permute2x128_si256(first, second, 0x20));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(to + 16), _mm256_permute2x128_si256(first, second, 0x31));
}
inline Floats LoadBytes(const std::uint8_t* from) noexcept {
    const __m128i bytes = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(from));
    return _mm256_cvtepi32_ps(_mm256_cvtepu8_epi32(bytes));
}

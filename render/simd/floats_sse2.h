// Four floats in a vector (floats_plain.h says what the functions do).

using Floats = __m128;
inline constexpr std::int32_t kFloats = 4;

inline Floats All(float x) noexcept { return _mm_set1_ps(x); }
inline Floats Load(const float* from) noexcept { return _mm_loadu_ps(from); }
inline void Store(float* to, Floats x) noexcept { _mm_storeu_ps(to, x); }

inline Floats Least(Floats a, Floats b) noexcept { return _mm_min_ps(a, b); }
inline Floats Most(Floats a, Floats b) noexcept { return _mm_max_ps(a, b); }
inline Floats Unit(Floats x) noexcept { return Least(Most(x, All(0.0f)), All(1.0f)); }
inline Floats NumberOr0(Floats x) noexcept { return _mm_and_ps(_mm_cmpord_ps(x, x), x); }
inline Floats WherePositive(Floats sign, Floats x) noexcept {
    return _mm_and_ps(_mm_cmpgt_ps(sign, _mm_setzero_ps()), x);
}

inline Floats SquareRoot(Floats x) noexcept { return _mm_sqrt_ps(x); }
inline Floats PowerGuess(Floats x, float times, float plus) noexcept {
    const Floats bits = _mm_cvtepi32_ps(_mm_castps_si128(x));
    return _mm_castsi128_ps(_mm_cvttps_epi32(bits * All(times) + All(plus)));
}

inline constexpr std::int32_t kBitsOf1 = 0x3F800000;
using Marks = __m128i;
inline Marks NoMarks() noexcept { return _mm_setzero_si128(); }
inline Marks Marked(Marks marks, Floats x) noexcept {
    const __m128i bits = _mm_castps_si128(x);
    return _mm_or_si128(marks, _mm_or_si128(bits, _mm_sub_epi32(_mm_set1_epi32(kBitsOf1), bits)));
}
inline bool AreMarked(Marks marks) noexcept { return _mm_movemask_ps(_mm_castsi128_ps(marks)) != 0; }

inline Floats Evens(Floats a, Floats b) noexcept { return _mm_shuffle_ps(a, b, _MM_SHUFFLE(2, 0, 2, 0)); }
inline Floats Odds(Floats a, Floats b) noexcept { return _mm_shuffle_ps(a, b, _MM_SHUFFLE(3, 1, 3, 1)); }
inline void StoreInTurn(float* to, Floats a, Floats b) noexcept {
    Store(to, _mm_unpacklo_ps(a, b));
    Store(to + 4, _mm_unpackhi_ps(a, b));
}

struct FourFloats {
    Floats a, b, c, d;
};
inline FourFloats Transposed(const FourFloats& x) noexcept {
    const Floats ab = _mm_unpacklo_ps(x.a, x.b), cd = _mm_unpacklo_ps(x.c, x.d);
    const Floats abHigh = _mm_unpackhi_ps(x.a, x.b), cdHigh = _mm_unpackhi_ps(x.c, x.d);
    return {_mm_movelh_ps(ab, cd), _mm_movehl_ps(cd, ab), _mm_movelh_ps(abHigh, cdHigh),
            _mm_movehl_ps(cdHigh, abHigh)};
}
inline FourFloats LoadFours(const float* from) noexcept {
    return Transposed({Load(from), Load(from + 4), Load(from + 8), Load(from + 12)});
}
inline Floats Load4(const std::uint16_t* from) noexcept {
    const __m128i words = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(from));
    return _mm_cvtepi32_ps(_mm_unpacklo_epi16(words, _mm_setzero_si128()));
}
inline FourFloats LoadFours(const std::uint16_t* from) noexcept {
    return Transposed({Load4(from), Load4(from + 4), Load4(from + 8), Load4(from + 12)});
}
inline Floats Load4(const float* from) noexcept { return Load(from); }
template <typename Sample, typename Convert>
inline FourFloats SumFours(const Sample* from, Convert&& convert) noexcept {
    const auto sum = [&](int cell) {
        const auto pixel = [&](int p) { return convert(Load4(from + 16 * cell + 4 * p)); };
        return (pixel(0) + pixel(2)) + (pixel(1) + pixel(3));
    };
    return Transposed({sum(0), sum(1), sum(2), sum(3)});
}
inline void StoreFours(float* to, const FourFloats& x) noexcept {
    const FourFloats pixels = Transposed(x);
    Store(to, pixels.a);
    Store(to + 4, pixels.b);
    Store(to + 8, pixels.c);
    Store(to + 12, pixels.d);
}
inline void StreamFours(float* to, const FourFloats& x) noexcept {
    const FourFloats pixels = Transposed(x);
    _mm_stream_ps(to, pixels.a);
    _mm_stream_ps(to + 4, pixels.b);
    _mm_stream_ps(to + 8, pixels.c);
    _mm_stream_ps(to + 12, pixels.d);
}
inline void EndStream() noexcept { _mm_sfence(); }
// The pack is of signed numbers, so that they are moved into its range and back.
inline void Store8(std::uint16_t* to, Floats a, Floats b) noexcept {
    const __m128i half = _mm_set1_epi32(32768);
    const __m128i words = _mm_packs_epi32(_mm_sub_epi32(_mm_cvttps_epi32(a), half),
                                          _mm_sub_epi32(_mm_cvttps_epi32(b), half));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(to), _mm_xor_si128(words, _mm_set1_epi16(-32768)));
}
inline void StoreFours(std::uint16_t* to, const FourFloats& x) noexcept {
    const FourFloats pixels = Transposed(x);
    Store8(to, pixels.a, pixels.b);
    Store8(to + 8, pixels.c, pixels.d);
}
inline Floats LoadBytes(const std::uint8_t* from) noexcept {
    std::int32_t four;
    __builtin_memcpy(&four, from, sizeof four);
    const __m128i words = _mm_unpacklo_epi8(_mm_cvtsi32_si128(four), _mm_setzero_si128());
    return _mm_cvtepi32_ps(_mm_unpacklo_epi16(words, _mm_setzero_si128()));
}

// Sixteen floats in a vector (floats_plain.h says what the functions do).

using Floats = __m512;
inline constexpr std::int32_t kFloats = 16;

inline Floats All(float x) noexcept { return _mm512_set1_ps(x); }
inline Floats Load(const float* from) noexcept { return _mm512_loadu_ps(from); }
inline void Store(float* to, Floats x) noexcept { _mm512_storeu_ps(to, x); }

inline Floats Least(Floats a, Floats b) noexcept { return _mm512_min_ps(a, b); }
inline Floats Most(Floats a, Floats b) noexcept { return _mm512_max_ps(a, b); }
// As whole numbers, for which the processor has more units.
inline Floats Unit(Floats x) noexcept {
    const __m512i positive = _mm512_max_epi32(_mm512_castps_si512(x), _mm512_setzero_si512());
    return _mm512_castsi512_ps(_mm512_min_epi32(positive, _mm512_castps_si512(All(1.0f))));
}
inline Floats NumberOr0(Floats x) noexcept {
    return _mm512_maskz_mov_ps(_mm512_cmp_ps_mask(x, x, _CMP_ORD_Q), x);
}
inline Floats WherePositive(Floats sign, Floats x) noexcept {
    return _mm512_maskz_mov_ps(_mm512_cmp_ps_mask(sign, _mm512_setzero_ps(), _CMP_GT_OQ), x);
}

inline Floats SquareRoot(Floats x) noexcept { return _mm512_sqrt_ps(x); }
inline Floats PowerGuess(Floats x, float times, float plus) noexcept {
    const Floats bits = _mm512_cvtepi32_ps(_mm512_castps_si512(x));
    return _mm512_castsi512_ps(_mm512_cvttps_epi32(bits * All(times) + All(plus)));
}

inline constexpr std::int32_t kBitsOf1 = 0x3F800000;
using Marks = __m512i;
inline Marks NoMarks() noexcept { return _mm512_setzero_si512(); }
inline Marks Marked(Marks marks, Floats x) noexcept {
    constexpr int kAnyOfThree = 0xFE;
    const __m512i bits = _mm512_castps_si512(x);
    return _mm512_ternarylogic_epi32(marks, bits, _mm512_sub_epi32(_mm512_set1_epi32(kBitsOf1), bits),
                                     kAnyOfThree);
}
inline bool AreMarked(Marks marks) noexcept { return _mm512_cmplt_epi32_mask(marks, _mm512_setzero_si512()) != 0; }

// Places in two vectors that follow one another.
inline Floats Picked(Floats a, Floats b, __m512i places) noexcept {
    return _mm512_permutex2var_ps(a, places, b);
}
inline Floats Evens(Floats a, Floats b) noexcept {
    return Picked(a, b, _mm512_setr_epi32(0, 2, 4, 6, 8, 10, 12, 14, 16, 18, 20, 22, 24, 26, 28, 30));
}
inline Floats Odds(Floats a, Floats b) noexcept {
    return Picked(a, b, _mm512_setr_epi32(1, 3, 5, 7, 9, 11, 13, 15, 17, 19, 21, 23, 25, 27, 29, 31));
}
inline void StoreInTurn(float* to, Floats a, Floats b) noexcept {
    const __m512i low = _mm512_setr_epi32(0, 16, 1, 17, 2, 18, 3, 19, 4, 20, 5, 21, 6, 22, 7, 23);
    Store(to, Picked(a, b, low));
    Store(to + 16, Picked(a, b, _mm512_add_epi32(low, _mm512_set1_epi32(8))));
}
inline Floats LowHalves(Floats a, Floats b) noexcept {
    return _mm512_shuffle_f32x4(a, b, _MM_SHUFFLE(1, 0, 1, 0));
}
inline Floats HighHalves(Floats a, Floats b) noexcept {
    return _mm512_shuffle_f32x4(a, b, _MM_SHUFFLE(3, 2, 3, 2));
}

struct FourFloats {
    Floats a, b, c, d;
};
// From four pixels in each vector.
inline FourFloats Separated(const FourFloats& x) noexcept {
    const __m512i first = _mm512_setr_epi32(0, 4, 8, 12, 16, 20, 24, 28, 1, 5, 9, 13, 17, 21, 25, 29);
    const __m512i last = _mm512_add_epi32(first, _mm512_set1_epi32(2));
    const Floats ab = Picked(x.a, x.b, first), cd = Picked(x.a, x.b, last);
    const Floats abHigh = Picked(x.c, x.d, first), cdHigh = Picked(x.c, x.d, last);
    return {LowHalves(ab, abHigh), HighHalves(ab, abHigh), LowHalves(cd, cdHigh), HighHalves(cd, cdHigh)};
}
// To four pixels in each vector.
inline FourFloats Joined(const FourFloats& x) noexcept {
    const __m512i first = _mm512_setr_epi32(0, 8, 16, 24, 1, 9, 17, 25, 2, 10, 18, 26, 3, 11, 19, 27);
    const __m512i last = _mm512_add_epi32(first, _mm512_set1_epi32(4));
    const Floats ab = LowHalves(x.a, x.b), cd = LowHalves(x.c, x.d);
    const Floats abHigh = HighHalves(x.a, x.b), cdHigh = HighHalves(x.c, x.d);
    return {Picked(ab, cd, first), Picked(ab, cd, last), Picked(abHigh, cdHigh, first),
            Picked(abHigh, cdHigh, last)};
}
inline FourFloats LoadFours(const float* from) noexcept {
    return Separated({Load(from), Load(from + 16), Load(from + 32), Load(from + 48)});
}
inline Floats LoadWords(const std::uint16_t* from) noexcept {
    return _mm512_cvtepi32_ps(
        _mm512_cvtepu16_epi32(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(from))));
}
inline FourFloats LoadFours(const std::uint16_t* from) noexcept {
    return Separated({LoadWords(from), LoadWords(from + 16), LoadWords(from + 32), LoadWords(from + 48)});
}
inline Floats Load16(const float* from) noexcept { return Load(from); }
inline Floats Load16(const std::uint16_t* from) noexcept { return LoadWords(from); }
template <typename Sample, typename Convert>
inline FourFloats SumFours(const Sample* from, Convert&& convert) noexcept {
    const auto halves = [&](int cell) {
        const Floats first = convert(Load16(from + 16 * cell)), second = convert(Load16(from + 16 * cell + 16));
        return LowHalves(first, second) + HighHalves(first, second);
    };
    const auto sums = [&](int cell) {
        const Floats first = halves(cell), second = halves(cell + 2);
        return _mm512_shuffle_f32x4(first, second, _MM_SHUFFLE(2, 0, 2, 0)) +
               _mm512_shuffle_f32x4(first, second, _MM_SHUFFLE(3, 1, 3, 1));
    };
    return Separated({sums(0), sums(4), sums(8), sums(12)});
}
inline void StoreFours(float* to, const FourFloats& x) noexcept {
    const FourFloats pixels = Joined(x);
    Store(to, pixels.a);
    Store(to + 16, pixels.b);
    Store(to + 32, pixels.c);
    Store(to + 48, pixels.d);
}
inline void StreamFours(float* to, const FourFloats& x) noexcept {
    const FourFloats pixels = Joined(x);
    _mm512_stream_ps(to, pixels.a);
    _mm512_stream_ps(to + 16, pixels.b);
    _mm512_stream_ps(to + 32, pixels.c);
    _mm512_stream_ps(to + 48, pixels.d);
}
inline void EndStream() noexcept { _mm_sfence(); }
inline void StoreWords(std::uint16_t* to, Floats x) noexcept {
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(to), _mm512_cvtepi32_epi16(_mm512_cvttps_epi32(x)));
}
inline void StoreFours(std::uint16_t* to, const FourFloats& x) noexcept {
    const FourFloats pixels = Joined(x);
    StoreWords(to, pixels.a);
    StoreWords(to + 16, pixels.b);
    StoreWords(to + 32, pixels.c);
    StoreWords(to + 48, pixels.d);
}
inline Floats LoadBytes(const std::uint8_t* from) noexcept {
    return _mm512_cvtepi32_ps(_mm512_cvtepu8_epi32(_mm_loadu_si128(reinterpret_cast<const __m128i*>(from))));
}

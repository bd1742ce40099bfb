// Single floats, for processors without a vocabulary of their own. floats_sse2.h and floats_avx2.h have the same
// functions for vectors. Numbers add, subtract, multiply and divide by the operators of the language.

using Floats = float;
inline constexpr std::int32_t kFloats = 1;

inline Floats All(float x) noexcept { return x; }
inline Floats Load(const float* from) noexcept { return *from; }
inline void Store(float* to, Floats x) noexcept { *to = x; }

// The second number if they are equal or one of them is not a number.
inline Floats Least(Floats a, Floats b) noexcept { return a < b ? a : b; }
inline Floats Most(Floats a, Floats b) noexcept { return a > b ? a : b; }
// Clamped to 0..1.
inline Floats Unit(Floats x) noexcept { return Least(Most(x, All(0.0f)), All(1.0f)); }
// 0 where x is not a number.
inline Floats NumberOr0(Floats x) noexcept { return x == x ? x : 0.0f; }
// x where `sign` is above 0, else 0.
inline Floats WherePositive(Floats sign, Floats x) noexcept { return sign > 0.0f ? x : 0.0f; }

inline Floats SquareRoot(Floats x) noexcept { return __builtin_sqrtf(x); }
// The bits of a float, taken as a whole number, nearly are its logarithm. The float whose bits are `times` those of x,
// and `plus`.
inline Floats PowerGuess(Floats x, float times, float plus) noexcept {
    std::int32_t bits;
    __builtin_memcpy(&bits, &x, sizeof bits);
    bits = static_cast<std::int32_t>(static_cast<float>(bits) * times + plus);
    __builtin_memcpy(&x, &bits, sizeof bits);
    return x;
}

// Numbers from 0 to 1 have the bits of whole numbers from 0 to kBitsOf1; those of all others are larger, or negative as
// whole numbers. A mark is negative from the first such number on.
inline constexpr std::uint32_t kBitsOf1 = 0x3F800000;
using Marks = std::uint32_t;
inline Marks NoMarks() noexcept { return 0; }
inline Marks Marked(Marks marks, Floats x) noexcept {
    std::uint32_t bits;
    __builtin_memcpy(&bits, &x, sizeof bits);
    return marks | bits | (kBitsOf1 - bits);
}
inline bool AreMarked(Marks marks) noexcept { return marks >> 31 != 0; }

// Of the numbers of a, then of b: those with even places, those with odd places, and the two in turn.
inline Floats Evens(Floats a, Floats) noexcept { return a; }
inline Floats Odds(Floats, Floats b) noexcept { return b; }
inline void StoreInTurn(float* to, Floats a, Floats b) noexcept {
    to[0] = a;
    to[1] = b;
}

struct FourFloats {
    Floats a, b, c, d;
};
// Four numbers for each pixel: the first numbers of all pixels, the second, and so on.
inline FourFloats LoadFours(const float* from) noexcept { return {from[0], from[1], from[2], from[3]}; }
inline FourFloats LoadFours(const std::uint16_t* from) noexcept {
    const auto number = [from](int i) { return static_cast<float>(static_cast<std::int32_t>(from[i])); };
    return {number(0), number(1), number(2), number(3)};
}
inline void StoreFours(float* to, const FourFloats& x) noexcept {
    to[0] = x.a;
    to[1] = x.b;
    to[2] = x.c;
    to[3] = x.d;
}
// For each four pixels the sums of their first numbers, of their second, and so on, each number converted.
template <typename Sample, typename Convert>
inline FourFloats SumFours(const Sample* from, Convert&& convert) noexcept {
    const auto sum = [&](int c) {
        const auto number = [&](int p) { return convert(static_cast<Floats>(from[4 * p + c])); };
        return (number(0) + number(2)) + (number(1) + number(3));
    };
    return {sum(0), sum(1), sum(2), sum(3)};
}
// Truncated; within 0..65535.
inline void StoreFours(std::uint16_t* to, const FourFloats& x) noexcept {
    const auto number = [](float f) { return static_cast<std::uint16_t>(static_cast<std::int32_t>(f)); };
    to[0] = number(x.a);
    to[1] = number(x.b);
    to[2] = number(x.c);
    to[3] = number(x.d);
}
// The same for pixels from the start of a line of the caches on that will not be read again soon.
inline void StreamFours(float* to, const FourFloats& x) noexcept { StoreFours(to, x); }
inline void EndStream() noexcept {}
inline Floats LoadBytes(const std::uint8_t* from) noexcept {
    return static_cast<float>(static_cast<std::int32_t>(*from));
}

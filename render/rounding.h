// The rounding rules of the renderer, by name. All of them take and return doubles or integers of stated
// width; none depends on the processor's rounding mode.
#pragma once

#include <cmath>
#include <cstdint>
#include <limits>

namespace velmora::render {

// Narrows to single precision at the points where the renderer's arithmetic is defined to do so.
constexpr float Narrow(double value) noexcept {
    return static_cast<float>(value);
}

// Toward zero. NaN gives 0; values beyond the 32-bit range saturate.
constexpr std::int32_t Truncate(double value) noexcept {
    if (value >= 2147483647.0) return std::numeric_limits<std::int32_t>::max();
    if (value <= -2147483648.0) return std::numeric_limits<std::int32_t>::min();
    return value == value ? static_cast<std::int32_t>(value) : 0;
}

// To the nearest integer, halves away from zero: 2.5 gives 3, -2.5 gives -3.
constexpr std::int32_t RoundHalfAway(double value) noexcept {
    return Truncate(value >= 0.0 ? value + 0.5 : value - 0.5);
}

// To the nearest unsigned integer, halves up, saturating at 0 and 4294967295. NaN gives 0.
constexpr std::uint32_t RoundToUnsigned(double value) noexcept {
    const double shifted = value + 0.5;
    if (!(shifted >= 0.0)) return 0;
    if (shifted >= 4294967296.0) return std::numeric_limits<std::uint32_t>::max();
    return static_cast<std::uint32_t>(shifted);
}

// To the nearest whole number, halves to the even one.
inline double NearestTiesToEven(double value) noexcept {
    const double below = std::floor(value);
    const double fraction = value - below;
    if (fraction < 0.5) return below;
    if (fraction > 0.5) return below + 1.0;
    return std::fmod(below, 2.0) == 0.0 ? below : below + 1.0;
}

// Toward zero with a tolerance of 1e-12: a product that misses a whole number only by rounding error counts as that
// number. Saturates like Truncate.
inline std::int32_t TruncateTolerant(double value) noexcept {
    constexpr double kAlmostHalf = 0.499999999999;
    if (value != value) return 0;
    // Beyond this a double is too coarse for the correction, and the result saturates anyway.
    if (value > 4294967296.0 || value < -4294967296.0) return Truncate(value);
    return Truncate(NearestTiesToEven(value > 0.0 ? value - kAlmostHalf : value + kAlmostHalf));
}

}  // namespace velmora::render

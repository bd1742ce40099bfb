#include "render/rounding.h"

#include <cmath>

namespace velmora::render {
namespace {

double NearestTiesToEven(double value) noexcept {
    const double below = std::floor(value);
    const double fraction = value - below;
    if (fraction < 0.5) return below;
    if (fraction > 0.5) return below + 1.0;
    return std::fmod(below, 2.0) == 0.0 ? below : below + 1.0;
}

}  // namespace

std::int32_t TruncateTolerant(double value) noexcept {
    constexpr double kAlmostHalf = 0.499999999999;
    if (value != value) return 0;
    // Beyond this a double is too coarse for the correction, and the result saturates anyway.
    if (value > 4294967296.0 || value < -4294967296.0) return Truncate(value);
    return Truncate(NearestTiesToEven(value > 0.0 ? value - kAlmostHalf : value + kAlmostHalf));
}

}  // namespace velmora::render

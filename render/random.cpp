#include "render/random.h"

#include <algorithm>

#include "render/rounding.h"

namespace velmora::render {

double Random::DrawDecimal(float low, float high, int decimals) noexcept {
    double scale = 1.0;
    for (int i = 0; i < decimals; ++i) scale *= 10.0;
    const std::int32_t drawn = Draw(RoundHalfAway(Narrow(low * scale)), RoundHalfAway(Narrow(high * scale)));
    return std::clamp(drawn / scale, double{std::min(low, high)}, double{std::max(low, high)});
}

}  // namespace velmora::render

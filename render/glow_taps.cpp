#include "render/glow.h"

#include <algorithm>

#include "render/rounding.h"

namespace velmora::render {
namespace {

// The glow layer is the sum of three blurs: the first softens outlines, the second makes halos, the third is the mist.
// Standard deviations are relative to the picture's height.
constexpr double kNarrowSigma = 0.004;
constexpr double kMiddleSigma = 0.020;
constexpr double kWideSigma = 0.090;

// The variance that two halvings, or two doublings, add to a blur, in squares of the coarser cells.
constexpr double kResamplingVariance = 0.1875 + 0.1875 / 4;

// A filter of about this variance: passes of (t, 1 − 2t, t) combined into one.
GlowTaps MakeTaps(double variance, int passes) noexcept {
    const double t = std::max(variance, 0.0) / (2.0 * passes);
    double weights[GlowTaps::kMostPairs + 2] = {1.0};  // from the middle outward
    for (int pass = 0; pass < passes; ++pass) {
        double inner = weights[1];
        for (int i = 0; i <= passes; ++i) {
            const double own = weights[i];
            weights[i] = own * (1.0 - 2.0 * t) + (inner + weights[i + 1]) * t;
            inner = own;
        }
    }
    GlowTaps taps;
    taps.pairs = passes;
    taps.middle = static_cast<std::uint16_t>(std::min(Truncate(weights[0] * 65536.0), 65535));
    for (int i = 0; i < passes; ++i) {
        taps.pair[static_cast<std::size_t>(i)] =
            static_cast<std::uint16_t>(Truncate(weights[i + 1] * 65536.0));
    }
    return taps;
}

}  // namespace

GlowLayerTaps MakeGlowLayerTaps(double height, double cell) noexcept {
    const auto square = [](double x) { return x * x; };
    const double onScreen = 0.25 * (1.0 - 1.0 / square(cell));  // by averaging blocks and by interpolation
    const double narrow = std::max(square(kNarrowSigma * height / cell) - onScreen, 0.0);
    const double beforeMiddle = (onScreen + narrow) / 16 + 2 * kResamplingVariance;
    const double middle = std::max(square(kMiddleSigma * height / cell) / 16 - beforeMiddle, 0.0);
    const double beforeWide = (beforeMiddle + middle) / 16 + 2 * kResamplingVariance;
    const double wide = std::max(square(kWideSigma * height / cell) / 256 - beforeWide, 0.0);
    return {MakeTaps(narrow, 2), MakeTaps(middle, 4), MakeTaps(wide, 4)};
}

}  // namespace velmora::render

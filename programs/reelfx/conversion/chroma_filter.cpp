#include "programs/reelfx/conversion/chroma_filter.h"

#include <cmath>

namespace velmora::hosts {
namespace {

double Cubic(double distance) {
    constexpr double kSlope = -0.6;
    const double d = std::abs(distance);
    if (d >= 2.0) return 0.0;
    if (d >= 1.0) return kSlope * (((d - 5.0) * d + 8.0) * d - 4.0);
    return ((kSlope + 2.0) * d - (kSlope + 3.0)) * d * d + 1.0;
}

// The taps around `centre`, for a cubic that is stretched by `stretch` samples.
FilterTaps TapsAround(double centre, int stretch) {
    constexpr double kNothing = 1e-9;
    const int first = static_cast<int>(std::floor(centre)) - 2 * stretch + 1;
    const int last = static_cast<int>(std::floor(centre)) + 2 * stretch;
    double sum = 0.0;
    for (int place = first; place <= last; ++place) sum += Cubic((place - centre) / stretch);
    FilterTaps taps;
    for (int place = first; place <= last; ++place) {
        const double weight = Cubic((place - centre) / stretch) / sum;
        if (std::abs(weight) > kNothing) taps.push_back({place, static_cast<float>(weight)});
    }
    return taps;
}

}  // namespace

std::vector<FilterTaps> EnlargingTaps(int factor, double position) {
    std::vector<FilterTaps> result;
    result.reserve(static_cast<std::size_t>(factor));
    for (int p = 0; p < factor; ++p) result.push_back(TapsAround((p - position) / factor, 1));
    return result;
}

FilterTaps ReducingTaps(int factor, double position) {
    return TapsAround(position, factor);
}

}  // namespace velmora::hosts

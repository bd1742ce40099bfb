#include "render/deep/deep_tone.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <numbers>

namespace velmora::render {
namespace {

constexpr float kNoBound = std::numeric_limits<float>::infinity();

DeepTone::Line LineOf(const ColourStage& colour) noexcept {
    const double offset = colour.Offset();
    const double gain = colour.Gain().value_or(1.0);
    const double times = gain * (1.0 - std::abs(offset));
    const double plus = gain * (std::max(offset, 0.0) - 0.5) + 0.5;
    const bool isClamped = gain > 1.0;
    return {static_cast<float>(times), static_cast<float>(plus), isClamped ? 0.0f : -kNoBound,
            isClamped ? 1.0f : kNoBound};
}

DeepTone::Mix MixOf(std::int32_t weight) noexcept {
    const auto share = [weight](double part) { return static_cast<float>(weight * part / (128.0 * 256.0)); };
    return {static_cast<float>((127 - weight) / 128.0), share(76), share(149), share(30)};
}

DeepTone::Gamma GammaOf(double gamma) noexcept {
    // sin(pi z) for |z| <= 1/2, by the odd polynomial with the least greatest error among those that are exact at the
    // ends, where black must stay black.
    constexpr double kSine[] = {3.141580651881463, -5.167088727680982, 2.541387300211141, -0.55329127836248};
    DeepTone::Gamma result;
    for (std::size_t i = 0; i < result.factors.size(); ++i) {
        result.factors[i] = static_cast<float>(0.5 * gamma * kSine[i] + (i == 0 ? 1.0 - gamma : 0.0));
    }
    const auto slopeAt = [gamma](double q) {
        const double pi = std::numbers::pi;
        return static_cast<float>(gamma * pi / 2.0 * std::sin(pi * q) + (1.0 - gamma));
    };
    result.slopeBelow = slopeAt(0.0);
    result.slopeAbove = slopeAt(255.0 / 256.0);
    return result;
}

DeepTone::Tint TintOf(std::int32_t offset) noexcept {
    const double from = offset / 256.0;
    if (offset > 0) {
        const double times = (256 - offset) / 255.0;
        return {true, static_cast<float>(times), static_cast<float>(0.5 * times + from - 0.5),
                static_cast<float>(255.0 / 256.0 - 0.5)};
    }
    const double times = 255.0 / (256 + offset);
    return {false, static_cast<float>(times), static_cast<float>((0.5 + from) * times - 0.5),
            offset < 0 ? -0.5f : -kNoBound};
}

}  // namespace

DeepTone DeepToneOf(const ColourStage& colour, const TintStage& tint) noexcept {
    DeepTone tone;
    if (colour.IsActive()) {
        tone.hasLine = colour.Offset() != 0.0f || colour.Gain().has_value();
        tone.line = LineOf(colour);
        tone.mixes = colour.Mixes();
        tone.mix = MixOf(colour.Weight());
    }
    if (tint.IsActive()) {
        tone.tints = true;
        tone.bends = tint.Gamma() != 0.0f;
        tone.gamma = GammaOf(tint.Gamma());
        const TintOffsets& offsets = tint.Offsets();
        tone.tint = {TintOf(offsets.red), TintOf(offsets.green), TintOf(offsets.blue)};
    }
    return tone;
}

}  // namespace velmora::render

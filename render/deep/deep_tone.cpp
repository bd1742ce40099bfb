#include "render/deep/deep_tone.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <iterator>
#include <numbers>

namespace velmora::render {
namespace {

// What a truncation to whole levels of 255 takes away on average.
constexpr double kHalfLevel = 0.5 / 255.0;

DeepTone::Line LineOf(const ColourStage& colour) noexcept {
    const double offset = colour.Offset();
    const double gain = colour.Gain().value_or(1.0);
    const double truncated = colour.Gain() ? kHalfLevel : 0.0;
    const bool isClamped = gain > 1.0;
    const double exact = gain * (std::max(offset, 0.0) - 0.5) + 0.5, rise = gain * (1.0 - std::abs(offset));
    const double plus = isClamped ? exact - truncated : std::max(exact - truncated, 0.0);
    const double times = isClamped ? rise : exact + rise - truncated - plus;
    DeepTone::Line line = {static_cast<float>(times), static_cast<float>(plus), isClamped, false};
    // White stays white to the last bit, so that what follows finds it inside.
    if (!colour.Gain() && offset > 0.0) line.times = 1.0f - line.plus;
    line.staysInside = line.plus >= 0.0f && line.times + line.plus <= 1.0f;
    return line;
}

DeepTone::Mix MixOf(std::int32_t weight) noexcept {
    const auto share = [weight](double part) { return static_cast<float>(weight * part / (128.0 * 256.0)); };
    // The grey value is truncated, and then the sum.
    const double truncated = kHalfLevel * (weight / 128.0 + 1.0);
    return {static_cast<float>((127 - weight) / 128.0), share(76), share(149), share(30),
            static_cast<float>(-truncated)};
}

// Of numbers of q.
constexpr double kTruncated = 0.5 / 256.0;
constexpr double kToUnit = 256.0 / 255.0;  // from q to x

// S and its slope.
struct Curve {
    double gamma;

    [[nodiscard]] double At(double q) const noexcept {
        return gamma * (1.0 - std::cos(std::numbers::pi * q)) / 2.0 + (1.0 - gamma) * q;
    }
    [[nodiscard]] double SlopeAt(double q) const noexcept {
        return gamma * std::numbers::pi / 2.0 * std::sin(std::numbers::pi * q) + (1.0 - gamma);
    }
};

// From numbers `in` times as large to numbers `out` times as large.
DeepTone::Gamma GammaOf(double gamma, double in, double out) noexcept {
    // sin(pi z) for |z| <= 1/2, by the odd polynomial with the least greatest error among those that are exact at the
    // ends, where black must stay black.
    constexpr double kSine[] = {3.141580651881463, -5.167088727680982, 2.541387300211141, -0.55329127836248};
    DeepTone::Gamma result;
    double scale = out;
    for (std::size_t i = 0; i < std::size(kSine); ++i) {
        scale /= i == 0 ? in : in * in;
        const double factor = 0.5 * gamma * kSine[i] + (i == 0 ? 1.0 - gamma : 0.0);
        result.factors[i] = static_cast<float>(factor * scale);
    }
    result.black = static_cast<float>((kTruncated - 0.5) * out);
    return result;
}

// After the gamma `first`, if there is one.
DeepTone::Tint TintOf(std::int32_t offset, double gamma, const DeepTone::Gamma& first) noexcept {
    constexpr double kWhite = 255.0 / 256.0;
    const bool bends = gamma != 0.0, lifts = offset > 0;
    const Curve curve{gamma};
    const double truncated = bends ? kTruncated : 0.0;
    const double from = offset / 256.0;
    const double times = lifts ? (256 - offset) / 255.0 : 255.0 / (256 + offset);
    // The tint of q.
    const auto tinted = [&](double q) { return lifts ? from + q * times : (q + from) * times; };
    const double black = std::max(tinted(0.0), 0.0);
    const double white = std::min(tinted(curve.At(kWhite) - truncated), kWhite);
    const auto slope = [&](double q, double thenAt) {
        return static_cast<float>(curve.SlopeAt(q) * times * curve.SlopeAt(thenAt));
    };
    DeepTone::Tint result;
    // Without a gamma the tint takes x - middle to x + black itself.
    const double in = bends ? 1.0 : 1.0 / kToUnit, out = bends ? 1.0 : kToUnit;
    result.times = static_cast<float>(times * in * out);
    result.plus = static_cast<float>((tinted(0.5 - truncated) - 0.5) * out);
    result.lifts = lifts;
    result.least = static_cast<float>(-0.5 * out);
    if (bends) result.least = std::max(result.least, result.times * first.black + result.plus);
    result.most = static_cast<float>((kWhite - 0.5) * out);
    result.slopeBelow = offset < 0 ? 0.0f : slope(0.0, black);
    result.slopeAbove = slope(kWhite, white);
    return result;
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
        tone.first = GammaOf(tint.Gamma(), kToUnit, 1.0);
        tone.second = GammaOf(tint.Gamma(), 1.0, kToUnit);
        tone.middle = static_cast<float>(0.5 * kToUnit);
        tone.black = tone.bends ? tone.second.black : static_cast<float>(-0.5 * kToUnit);
        const TintOffsets& offsets = tint.Offsets();
        tone.tint[0] = TintOf(offsets.red, tint.Gamma(), tone.first);
        tone.tint[1] = TintOf(offsets.green, tint.Gamma(), tone.first);
        tone.tint[2] = TintOf(offsets.blue, tint.Gamma(), tone.first);
    }
    return tone;
}

}  // namespace velmora::render

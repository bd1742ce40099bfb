// Colour and tint (render/colour.h, render/tint.h) as exact curves, without tables and without rounding.
//
// With x the channel, 0..1, and the plan's values v, g, w, o and gamma:
//   brightness, flicker   x (1 - |v|) + max(v, 0)
//   contrast              g (x - 1/2) + 1/2, clamped to 0..1 for g > 1
//   saturation            ((127 - w) x + w (76 R + 149 G + 30 B) / 256) / 128, clamped to 0..1
//   film gamma            S(q) = gamma (1 - cos(pi q)) / 2 + (1 - gamma) q with q = 255 x / 256, times 256 / 255
//   tint                  o > 0: o / 255 + x (256 - o) / 255, at most 1
//                         o <= 0: (255 x + o) / (256 + o), at least 0 for o < 0
// in the order brightness, contrast, saturation, gamma, tint, gamma. What the settings narrow (w and o are whole
// numbers) stays narrowed, so that the deep picture is the 8-bit one without its rounding.
//
// Below 0 and above 1 each step continues in a straight line, except where it is clamped: a clamped contrast stays at
// black and white, a tint that crushes blacks stays at black. A lifting tint continues its line from white on. The
// saturation's bounds widen to the range of the pixel's own channels, so that bright greys stay greys.
#pragma once

#include <array>

#include "render/colour.h"
#include "render/tint.h"

namespace velmora::render {

struct DeepTone {
    // Brightness, flicker and contrast in one line: clamp(times x + plus, least, most).
    struct Line {
        float times, plus, least, most;
    };
    // The saturation's shares.
    struct Mix {
        float own, red, green, blue;
    };
    // With z = 255 x / 256 - 1/2. S(z) - 1/2 = z (a + b z² + c z⁴ + d z⁶), which is within 4e-7 of the formula.
    struct Gamma {
        std::array<float, 4> factors;
        float slopeBelow, slopeAbove;  // at the ends of 0..255/256
    };
    struct Tint {
        bool lifts;         // o > 0
        float times, plus;  // of z
        float bound;        // of the result: the most if it lifts, else the least
    };

    bool hasLine = false;
    bool mixes = false;
    bool tints = false;
    bool bends = false;  // with a tint, even if it is neutral
    Line line{};
    Mix mix{};
    Gamma gamma{};
    std::array<Tint, 3> tint{};  // red, green, blue

    [[nodiscard]] bool IsActive() const noexcept { return hasLine || mixes || tints; }
};

[[nodiscard]] DeepTone DeepToneOf(const ColourStage& colour, const TintStage& tint) noexcept;

}  // namespace velmora::render

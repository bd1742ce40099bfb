// Colour and tint (render/colour.h, render/tint.h) as curves, without tables and without rounding.
//
// With x the channel, 0..1, and the plan's values v, g, w, o and gamma:
//   brightness, flicker   x (1 - |v|) + max(v, 0)
//   contrast              g (x - 1/2) + 1/2 - t, clamped to 0..1 for g > 1; else black is at least 0, with a line from
//                         there to the same white
//   saturation            ((127 - w) x + w (76 R + 149 G + 30 B) / 256) / 128 - t (1 + w / 128), clamped to 0..1
//   film gamma            S(q) = gamma (1 - cos(pi q)) / 2 + (1 - gamma) q with q = 255 x / 256, times 256 / 255;
//                         less t, but at least 0
//   tint                  o > 0: o / 255 + x (256 - o) / 255, at most 1
//                         o <= 0: (255 x + o) / (256 + o), at least 0
// in the order brightness, contrast, saturation, gamma, tint, gamma; the last at most 1.
//
// t is half a level of 255: where the 8-bit stage truncates it takes away that much on average, and several stages of
// a preset together take away several levels. Without t the deep picture would be visibly brighter than the 8-bit one.
// What the settings narrow (w and o are whole numbers) stays narrowed for the same reason.
//
// Below 0 and above 1 brightness and contrast continue as lines, except that a clamped contrast stays at black and
// white. What a channel is beyond 0 or 1 passes the saturation's shares without the clamp. Gamma and tint continue, as
// one stage, with their slopes at 0 and 1; a tint that crushes blacks stays at black.
#pragma once

#include "render/colour.h"
#include "render/tint.h"

namespace velmora::render {

struct DeepTone {
    // Brightness, flicker and contrast in one line: times x + plus.
    struct Line {
        float times, plus;
        bool isClamped;    // to 0..1
        bool staysInside;  // takes 0..1 into 0..1
    };
    // The saturation's shares.
    struct Mix {
        float own, red, green, blue, plus;
    };
    // S - 1/2 = max(z (a + b z² + c z⁴ + d z⁶), black) with z = q - 1/2, which is within 4e-7 of the formula. The
    // kernels leave the bound to the next step. S is t too high, which the next step takes away.
    struct Gamma {
        float factors[4];
        float black;
    };
    // max(times z + plus, least); at most `most`, which only matters if it lifts.
    struct Tint {
        bool lifts;  // o > 0
        float times, plus, least, most;
        float slopeBelow, slopeAbove;  // of the whole stage at x = 0 and x = 1
    };

    bool hasLine = false;
    bool mixes = false;
    bool tints = false;
    bool bends = false;  // with a tint, even if it is neutral
    Line line{};
    Mix mix{};
    // The gamma before the tint, from x - middle, and after it, to x + black. Without a gamma the tint alone does this.
    Gamma first{}, second{};
    float middle = 0.0f, black = 0.0f;
    Tint tint[3]{};  // red, green, blue

    [[nodiscard]] bool IsActive() const noexcept { return hasLine || mixes || tints; }
};

[[nodiscard]] DeepTone DeepToneOf(const ColourStage& colour, const TintStage& tint) noexcept;

}  // namespace velmora::render

// The stages after diffusion in double precision, restated pixel by pixel in levels of 255, with the bounds of what the
// 8-bit stages can make of the same pixel when each of them rounds.
#pragma once

#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <numbers>
#include <vector>

#include "render/chain.h"
#include "render/scratch_span.h"

namespace velmora::testing {

// A channel: the formula's value, and the least and the most that the 8-bit stages can have there.
struct Level {
    double low, exact, high;
};
using Colour = std::array<Level, 3>;  // red, green, blue

// Half a level, and a little for the single precision of the 8-bit tables.
inline constexpr double kRounding = 0.5 + 1e-3;

// Through a function that does not fall, and a rounding.
template <typename Function>
void Take(Level& level, double rounding, Function&& f) {
    level = {f(level.low) - rounding, f(level.exact), f(level.high) + rounding};
}

class ExactChain {
  public:
    explicit ExactChain(const render::FramePlan& plan) : m_plan(plan) {}

    // Row `y` after diffusion, to the end of the chain.
    void Run(std::vector<Colour>& row, std::int32_t y) const {
        for (Colour& colour : row) Tone(colour);
        if (m_plan.wear.IsActive()) Wear(row, y);
        if (m_plan.scratches.IsActive()) Scratches(row, y);
        for (std::uint32_t i = 0; i < m_plan.spots.Count(); ++i) Spot(m_plan.spots.Spot(i), row, y);
    }

  private:
    void Tone(Colour& colour) const {
        const render::ColourStage& stage = m_plan.colour;
        if (stage.IsActive()) {
            for (Level& level : colour) Line(stage, level);
            if (stage.Mixes()) Mix(stage.Weight(), colour);
        }
        const render::TintStage& tint = m_plan.tint;
        if (!tint.IsActive()) return;
        const std::int32_t offsets[] = {tint.Offsets().red, tint.Offsets().green, tint.Offsets().blue};
        for (std::size_t c = 0; c < 3; ++c) {
            Bend(tint.Gamma(), colour[c]);
            Take(colour[c], kRounding, [o = offsets[c]](double x) {
                return o > 0 ? std::min(o + x * (256 - o) / 255, 255.0)
                             : std::max((x + o) * 255 / (256 + o), 0.0);
            });
            Bend(tint.Gamma(), colour[c]);
            Take(colour[c], 0.0, [](double x) { return std::min(x, 255.0); });
        }
    }
    static void Line(const render::ColourStage& stage, Level& level) {
        const double v = stage.Offset();
        if (v != 0) Take(level, kRounding, [v](double x) { return v > 0 ? x + (255 - x) * v : x + x * v; });
        if (!stage.Gain()) return;
        // Truncated: half a level lower on average.
        Take(level, kRounding, [gain = *stage.Gain()](double x) {
            const double y = ((x / 255 - 0.5) * gain + 0.5) * 255 - 0.5;
            return gain > 1 ? std::clamp(y, 0.0, 255.0) : y;
        });
    }
    // The grey value is truncated, and then the sum.
    static void Mix(double weight, Colour& colour) {
        const double share = weight / (128 * 256), parts[] = {76 * share, 149 * share, 30 * share};
        const double rounding = kRounding * (1 + std::abs(weight) / 128), lost = 0.5 * (1 + weight / 128);
        Colour mixed;
        for (std::size_t c = 0; c < 3; ++c) {
            Level sum = {-lost - rounding, -lost, -lost + rounding};
            for (std::size_t other = 0; other < 3; ++other) {
                const double part = parts[other] + (other == c ? (127 - weight) / 128 : 0.0);
                const auto [low, exact, high] = colour[other];
                sum.low += part * std::clamp(part > 0 ? low : high, 0.0, 255.0);
                sum.exact += part * exact;
                sum.high += part * std::clamp(part > 0 ? high : low, 0.0, 255.0);
            }
            mixed[c] = {std::clamp(sum.low, 0.0, 255.0), std::clamp(sum.exact, 0.0, 255.0),
                        std::clamp(sum.high, 0.0, 255.0)};
        }
        colour = mixed;
    }
    static void Bend(double gamma, Level& level) {
        if (gamma == 0) return;
        Take(level, kRounding, [gamma](double x) {
            const double q = std::clamp(x, 0.0, 255.0) / 256;
            const double curve = (1 - std::cos(std::numbers::pi * q)) / 2;
            return std::max(256 * (curve * gamma + q * (1 - gamma)) - 0.5, 0.0);
        });
    }
    static void Shade(Level& level, double fraction) {
        Take(level, kRounding,
             [fraction](double x) { return fraction > 0 ? x + fraction * (255 - x) : x + fraction * x; });
    }
    void Wear(std::vector<Colour>& row, std::int32_t y) const {
        const render::WearStage& stage = m_plan.wear;
        stage.ForEachByte(static_cast<std::int32_t>(row.size()), y, [&](std::int32_t x, std::uint8_t byte) {
            Colour& colour = row[static_cast<std::size_t>(x)];
            for (std::size_t c = stage.BlueOnly() ? 2 : 0; c < 3; ++c)
                Shade(colour[c], byte / 255.0 * double{stage.Amount()});
        });
    }
    void Scratches(std::vector<Colour>& row, std::int32_t y) const {
        for (const render::ScratchLine& line : m_plan.scratches.Lines()) {
            render::ScratchSpan span;
            if (!FindSpan(line, m_plan.scratches.PlaceOf(y), span)) continue;
            for (std::int32_t i = 0; i < line.pixels; ++i) {
                const std::int32_t x = span.first + i;
                if (x < 0 || x >= static_cast<std::int32_t>(row.size())) continue;
                const double share = span.weights[i] * (span.strength / 4294967296.0);
                for (Level& level : row[static_cast<std::size_t>(x)]) Scratch(level, share, line.isWhite);
            }
        }
    }
    // Truncated too, and the share before it to 65536ths.
    static void Scratch(Level& level, double share, bool isWhite) {
        Take(level, kRounding + 255.0 / 65536, [share, isWhite](double x) {
            const double away = isWhite ? render::kBrightest - x : x - render::kDarkest;
            const double change = std::max(std::max(away, 0.0) * share - 0.5, 0.0);
            return isWhite ? x + change : x - change;
        });
    }
    static void Spot(const render::PlacedSpot& spot, std::vector<Colour>& row, std::int32_t y) {
        const std::int32_t line = y - spot.top;
        if (line < 0 || line >= spot.height) return;
        for (std::int32_t i = 0; i < spot.width; ++i) {
            const std::int32_t x = spot.left + i;
            if (x < 0 || x >= static_cast<std::int32_t>(row.size())) continue;
            const std::uint8_t byte = spot.ByteAt(line, i), key = spot.picture->pixels[0];
            if (byte == key) continue;
            for (Level& level : row[static_cast<std::size_t>(x)])
                Shade(level, render::SpotFraction(byte, key, spot.strength));
        }
    }

    const render::FramePlan& m_plan;
};

}  // namespace velmora::testing

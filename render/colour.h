// Colour, flicker, brightness and contrast.
//
// Every channel goes through one table that is built for the frame:
//   brightness and flicker: v = flicker offset + brightness / 2;
//     table[i] = i + R(i v) for v <= 0 (toward black), i + R((255 - i) v) for v > 0 (toward white);
//   contrast: ((i / 255 - 0.5) g + 0.5) 255, truncated and clamped, with the gain g from contrast / 2.
// Then, with saturation s, each pixel moves away from its grey value or toward it:
//   w = trunc(-127 s); Y = (76 R + 149 G + 30 B) >> 8;
//   X' = clamp(((127 - w) X + low16(Y w)) >> 7): grey at s = -1, unchanged near 0, about 2 X - Y at 1.
// Alpha is copied. R rounds halves away from zero.
#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>

#include "render/image.h"
#include "render/render_state.h"
#include "render/stage_settings.h"

namespace velmora::render {

// A lookup table for one channel.
using ByteTable = std::array<std::uint8_t, 256>;

// Tables that are a line clamped at black and white, as brightness, flicker and contrast make them. Kernels without
// byte permutations compute them faster than they can look them up.
//
// The entry for i, in unsigned 16 bits: (i × 256 × times >> 16) + plus, at most 65535, less minus, at least 0;
// shifted right by `shift` and at most 255.
struct ToneLine {
    std::uint16_t times = 0;
    std::uint16_t plus = 0;
    std::uint16_t minus = 0;
    std::uint16_t shift = 0;
};

[[nodiscard]] constexpr std::uint8_t EntryOf(const ToneLine& line, std::uint8_t i) noexcept {
    const std::uint32_t product = (std::uint32_t{i} << 8) * line.times >> 16;
    const std::uint32_t sum = std::min(product + line.plus, 65535u);
    const std::uint32_t rest = sum > line.minus ? sum - line.minus : 0u;
    return static_cast<std::uint8_t>(std::min(rest >> line.shift, 255u));
}

// The line that gives exactly this table, which rises by `slope` (0..8) from entry to entry where it is not clamped.
// None if no 16-bit numbers give it.
[[nodiscard]] std::optional<ToneLine> LineOf(const ByteTable& table, double slope) noexcept;

// The flicker's share of the brightness offset at a given time. The value changes `rate` times a second. The k-th
// value comes from a sequence seeded by `seed`, an arrangement's, and the host's seed, so every run gives the same. The
// cost does not depend on the time. Within +-0.5; single precision.
[[nodiscard]] float FlickerOffset(float seed, float flicker, std::uint32_t rate, double seconds,
                                  std::uint32_t hostSeed = 0) noexcept;

[[nodiscard]] ByteTable BrightnessTable(float offset) noexcept;
// `contrast` is half of the setting.
[[nodiscard]] ByteTable ContrastTable(float contrast) noexcept;

// The saturation mix of one pixel with weight w.
[[nodiscard]] Bgra MixWithGrey(Bgra pixel, std::int32_t weight) noexcept;

class ColourStage {
  public:
    static constexpr bool kIsDamage = false;
    static std::uint32_t Draws(const StageSettings&, std::int32_t) noexcept { return 0; }
    [[nodiscard]] bool IsActive() const noexcept { return m_active; }
    // Pixels are mixed with their grey value, so a table is not enough.
    [[nodiscard]] bool Mixes() const noexcept { return m_mixes; }
    [[nodiscard]] const ByteTable& Tone() const noexcept { return m_tone; }
    // Lines that give that table when applied in order; empty if the table is not made of lines.
    [[nodiscard]] std::span<const ToneLine> Lines() const noexcept {
        return {m_lines.data(), m_isLines ? m_lineCount : 0};
    }
    [[nodiscard]] std::int16_t Weight() const noexcept { return m_weight; }
    // What the table is made of: v above, and the contrast's gain, if there is a contrast.
    [[nodiscard]] float Offset() const noexcept { return m_offset; }
    [[nodiscard]] std::optional<double> Gain() const noexcept { return m_gain; }

  private:
    void AddLine(const ByteTable& table, double slope) noexcept;
    friend ColourStage PrepareColour(const StageSettings&, double, ContrastCache&) noexcept;

    bool m_active = false;
    bool m_mixes = false;
    std::int16_t m_weight = 0;  // w above
    float m_offset = 0.0f;
    std::optional<double> m_gain;
    ByteTable m_tone{};
    bool m_isLines = true;  // so far
    std::size_t m_lineCount = 0;
    std::array<ToneLine, 2> m_lines{};
};

// `seconds`: the frame's time. The contrast table is rebuilt only when its value changes.
[[nodiscard]] ColourStage PrepareColour(const StageSettings& settings, double seconds,
                                        ContrastCache& cache) noexcept;

}  // namespace velmora::render

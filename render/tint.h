// Tint and film gamma: a black-level shift for each channel and an S-shaped tone curve, in one table per channel:
// G[T[G[channel]]].
//
// T, from a channel's offset o (-255..255, 0 is neutral): a line from o at 0 to 255 at 255 for o > 0, else 0
// up to |o| and a line from there to 255. With o = 0 it maps 255 to 254, which is visible only with a gamma.
// G, from the gamma g: g (1 - cos(pi x)) / 2 + (1 - g) x.
#pragma once

#include <cstdint>

#include "render/colour.h"
#include "render/image.h"
#include "render/stage_settings.h"

namespace velmora::render {

// The offset of a channel's tint value t (0..1, 0.5 neutral).
[[nodiscard]] std::int32_t TintOffset(float tint) noexcept;
[[nodiscard]] ByteTable TintTable(std::int32_t offset) noexcept;
[[nodiscard]] ByteTable FilmGammaTable(float gamma) noexcept;

// The offsets of a tint's channels.
struct TintOffsets {
    std::int32_t red = 0;
    std::int32_t green = 0;
    std::int32_t blue = 0;
};

class TintStage {
  public:
    static constexpr bool kIsDamage = false;
    static std::uint32_t Draws(const StageSettings&, std::int32_t) noexcept { return 0; }
    [[nodiscard]] bool IsActive() const noexcept { return m_active; }
    // What the tables are made of.
    [[nodiscard]] const TintOffsets& Offsets() const noexcept { return m_offsets; }
    [[nodiscard]] float Gamma() const noexcept { return m_gamma; }
    [[nodiscard]] const ByteTable& Red() const noexcept { return m_red; }
    [[nodiscard]] const ByteTable& Green() const noexcept { return m_green; }
    [[nodiscard]] const ByteTable& Blue() const noexcept { return m_blue; }

  private:
    friend TintStage PrepareTint(const StageSettings&) noexcept;

    bool m_active = false;
    TintOffsets m_offsets;
    float m_gamma = 0.0f;
    ByteTable m_red{};
    ByteTable m_green{};
    ByteTable m_blue{};
};

[[nodiscard]] TintStage PrepareTint(const StageSettings& settings) noexcept;

}  // namespace velmora::render

// Jitter and border: shakes the whole picture by a random whole-pixel offset, like film that does not sit still in the
// gate, and fills the uncovered strip with the border colour.
#pragma once

#include <algorithm>
#include <cstdint>

#include "render/image.h"
#include "render/random.h"
#include "render/stage_settings.h"

namespace velmora::render {

class JitterStage {
  public:
    static constexpr bool kIsDamage = false;
    static std::uint32_t Draws(const StageSettings& settings, std::int32_t) noexcept {
        return settings.yJitter != 0 || settings.xJitter != 0 ? 2 : 0;
    }
    JitterStage() noexcept = default;
    JitterStage(std::int32_t dy, std::int32_t dx, std::uint32_t border) noexcept
        : m_dy(dy), m_dx(dx), m_border(border) {}

    [[nodiscard]] bool IsActive() const noexcept { return m_dy != 0 || m_dx != 0; }
    [[nodiscard]] std::int32_t Dy() const noexcept { return m_dy; }  // positive: down
    [[nodiscard]] std::int32_t Dx() const noexcept { return m_dx; }  // positive: to the right

    [[nodiscard]] std::uint32_t Border() const noexcept { return m_border; }

    // Row `y` of the shaken picture of `source`'s region.
    [[nodiscard]] ShiftedRow Shifted(const ImageView& source, std::int32_t y) const noexcept {
        const std::int32_t width = source.Region().Width();
        const std::int32_t row = y - m_dy;
        if (row < 0 || row >= source.Region().Height()) return {nullptr, 0, 0, m_border};
        const std::int32_t band = std::min(m_dx < 0 ? -m_dx : m_dx, width);
        const Bgra* pixels = source.Row(row);
        if (m_dx < 0) return {pixels + band, 0, width - band, m_border};
        return {pixels, band, width - band, m_border};
    }

  private:
    std::int32_t m_dy = 0;
    std::int32_t m_dx = 0;
    std::uint32_t m_border = 0;
};

// Draws the offsets: nothing if both amplitudes are 0, else the vertical offset and then the horizontal one.
[[nodiscard]] inline JitterStage PrepareJitter(const StageSettings& settings, Random& random) noexcept {
    if (settings.yJitter == 0 && settings.xJitter == 0) return {};
    const std::int32_t dy = random.Draw(-settings.yJitter, settings.yJitter);
    const std::int32_t dx = random.Draw(-settings.xJitter, settings.xJitter);
    return {dy, dx, settings.borderColour};
}

// The shaken picture of a frame, for stages that need their neighbours.
class ShakenRows final : public RowReader {
  public:
    ShakenRows(const ImageView& source, const JitterStage& jitter) noexcept
        : m_source(source), m_jitter(jitter) {}
    [[nodiscard]] ShiftedRow RowAt(std::int32_t y) const noexcept override {
        return m_jitter.Shifted(m_source, y);
    }

  private:
    const ImageView& m_source;
    const JitterStage& m_jitter;
};

}  // namespace velmora::render

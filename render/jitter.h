// Jitter and border: shakes the whole picture by a random whole-pixel offset, like film that does not sit still in the
// gate, and fills the uncovered strip with the border colour.
#pragma once

#include <cstdint>

#include "render/image.h"
#include "render/random.h"
#include "render/stage_settings.h"

namespace velmora::render {

// A row of the shaken picture: `count` source pixels from `pixels` start at column `start`, and the border fills the
// other columns.
struct ShiftedRow {
    const Bgra* pixels;
    std::int32_t start;
    std::int32_t count;
    std::uint32_t border;
};

// Writes the word to `count` pixels.
void FillPixels(Bgra* pixels, std::int32_t count, std::uint32_t colour) noexcept;

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
    ShiftedRow Shifted(const ImageView& source, std::int32_t y) const noexcept;

    // Row `y` of the shaken picture, as wide as `source`'s region. Either written to `out`, or a pointer into the
    // source if the row is already there unchanged.
    const Bgra* Row(const ImageView& source, Bgra* out, std::int32_t y) const noexcept;

  private:
    std::int32_t m_dy = 0;
    std::int32_t m_dx = 0;
    std::uint32_t m_border = 0;
};

// Draws the offsets: nothing if both amplitudes are 0, else the vertical offset and then the horizontal one.
[[nodiscard]] JitterStage PrepareJitter(const StageSettings& settings, Random& random) noexcept;

// The shaken picture of a frame, for stages that need their neighbours.
class ShakenRows final : public RowReader {
  public:
    ShakenRows(const ImageView& source, const JitterStage& jitter) noexcept
        : m_source(source), m_jitter(jitter) {}
    const Bgra* Read(std::int32_t y, Bgra* scratch) const noexcept override {
        return m_jitter.Row(m_source, scratch, y);
    }

  private:
    const ImageView& m_source;
    const JitterStage& m_jitter;
};

}  // namespace velmora::render

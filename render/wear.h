// Wear: lightens the picture through a grey picture of wear, tiled across the frame in vertical strips that
// each start at a random row of it every frame, so that the wear crawls as on a worn film.
//
// Fraction of a pixel under wear byte b: (b / 255) * wear, in single precision.
#pragma once

#include <cstdint>

#include "render/image.h"
#include "render/pictures.h"
#include "render/random.h"
#include "render/rounding.h"
#include "render/stage_settings.h"

namespace velmora::render {

[[nodiscard]] inline float WearFraction(std::uint8_t byte, float amount) noexcept {
    return Narrow(double{Narrow(byte / 255.0)} * amount);
}

class WearStage {
  public:
    [[nodiscard]] bool IsActive() const noexcept { return m_active; }

    // The plain form, row `y` of the processed rectangle. `in` may be `out`.
    void Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;

    // Calls visit(x, count, row) for each strip of row `y`, from the left: the strip's first column, its width
    // and the row of the wear picture over it.
    template <typename Visit>
    void ForEachStrip(std::int32_t width, std::int32_t y, Visit&& visit) const noexcept {
        Random starts = m_starts;
        const std::int32_t height = m_picture->height;
        const std::int32_t down = y % height;
        for (std::int32_t x = 0; x < width; x += m_picture->width) {
            const std::int32_t row = starts.Draw(0, height - 3) + down;
            const std::int32_t count = width - x < m_picture->width ? width - x : m_picture->width;
            visit(x, count, row < height ? row : row - height);
        }
    }
    [[nodiscard]] const GreyPicture& Picture() const noexcept { return *m_picture; }
    [[nodiscard]] float Amount() const noexcept { return m_amount; }
    [[nodiscard]] bool BlueOnly() const noexcept { return m_channels == kWearBlueOnly; }

  private:
    friend WearStage PrepareWear(const StageSettings&, std::int32_t, Random&) noexcept;

    bool m_active = false;
    std::int32_t m_channels = kWearAllChannels;
    const GreyPicture* m_picture = nullptr;
    // The strips' start rows are drawn anew for each row from where the frame's draws began: a strip count
    // that grows with the width needs no room, and a draw costs next to nothing beside a strip's pixels.
    Random m_starts;
    float m_amount = 0.0f;
};

// The strips of a frame of this width, each of which takes one draw.
[[nodiscard]] std::uint32_t WearStripCount(const StageSettings& settings, std::int32_t width) noexcept;

// Makes the frame's draws: one always, then one for each strip unless the wear is 0.
[[nodiscard]] WearStage PrepareWear(const StageSettings& settings, std::int32_t width,
                                    Random& random) noexcept;

}  // namespace velmora::render

// Wear: lightens the picture through a grey wear picture, tiled across the frame in vertical strips. In every frame
// each strip starts at a random row of the wear picture, so that the wear crawls as on worn film.
//
// Fraction of a pixel under wear byte b: (b / 255) * wear, in single precision.
#pragma once

#include <algorithm>
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

// The rows of the wear picture over one row of a frame: one for each strip, from the left.
//
// They are drawn again for each row, starting from the frame's first draw, so that no memory is needed for a strip count
// that grows with the width. The row kernels read them from WearFactors, which keeps a frame's draws.
class WearRows {
  public:
    // For row `y` of a frame, under a picture of `height` rows.
    WearRows(Random starts, std::int32_t height, std::int32_t y) noexcept
        : m_starts(starts), m_height(height), m_down(y % height) {}

    std::int32_t Next() noexcept {
        const std::int32_t row = m_starts.Draw(0, m_height - 3) + m_down;
        return row < m_height ? row : row - m_height;
    }

  private:
    Random m_starts;
    std::int32_t m_height;
    std::int32_t m_down;
};

class WearFactors;
struct Kernels;

// The number of strips in a frame of this width. Each takes one draw.
[[nodiscard]] std::uint32_t WearStripCount(const StageSettings& settings, std::int32_t width) noexcept;

class WearStage {
  public:
    static constexpr bool kIsDamage = true;
    // Always one, plus one for each strip unless the wear is 0.
    static std::uint32_t Draws(const StageSettings& settings, std::int32_t width) noexcept {
        return 1 + (settings.wear != 0.0f ? WearStripCount(settings, width) : 0);
    }
    [[nodiscard]] bool IsActive() const noexcept { return m_active; }

    // Row `y` of the processed rectangle. `in` may be `out`.
    void Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;

    // One pixel under a byte of the wear picture.
    void ShadeUnder(std::uint8_t byte, Bgra& pixel) const noexcept;

    // Calls visit(x, byte) for each byte of the wear picture over row `y`, from the left.
    template <typename Visit>
    void ForEachByte(std::int32_t width, std::int32_t y, Visit&& visit) const noexcept {
        WearRows rows = RowsOver(y);
        for (std::int32_t start = 0; start < width; start += m_picture->width) {
            const std::uint8_t* bytes = m_picture->pixels + rows.Next() * m_picture->rowStep;
            const std::int32_t end = std::min(start + m_picture->width, width);
            for (std::int32_t x = start; x < end; ++x) visit(x, *bytes++);
        }
    }
    [[nodiscard]] WearRows RowsOver(std::int32_t y) const noexcept {
        return {m_starts, m_picture->height, y};
    }
    [[nodiscard]] const GreyPicture& Picture() const noexcept { return *m_picture; }
    [[nodiscard]] float Amount() const noexcept { return m_amount; }
    [[nodiscard]] bool BlueOnly() const noexcept { return m_channels == kWearBlueOnly; }

  private:
    friend WearStage PrepareWear(const StageSettings&, std::int32_t, Random&, WearFactors&,
                                 const Kernels&) noexcept;

    bool m_active = false;
    std::int32_t m_channels = kWearAllChannels;
    const GreyPicture* m_picture = nullptr;
    Random m_starts;
    float m_amount = 0.0f;
    const WearFactors* m_factors = nullptr;  // null if the picture is too large for them, or memory short
    const Kernels* m_kernels = nullptr;
};

// Makes the frame's draws. The stage points into `factors` and is valid until they are set again.
[[nodiscard]] WearStage PrepareWear(const StageSettings& settings, std::int32_t width, Random& random,
                                    WearFactors& factors, const Kernels& kernels) noexcept;

}  // namespace velmora::render

// Glow ("Diffusion"): what a mist filter before the lens does. Highlights spread as a wide soft glow layer,
// whose radius is proportional to the picture's height, and which is laid over the picture by screening: the
// dark around a light gets most of it. A picture without lights stays as it is, no channel gets darker, alpha is
// kept.
//
// The glow layer is made before the rows are worked on, from the whole picture: highlights of a reduced picture
// (about 150 to 300 rows high) are blurred at three widths in a pyramid, integers all the way, so that the
// cost depends neither on the radius nor much on the picture's contents.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "render/glow_kernels.h"
#include "render/image.h"
#include "render/row_reader.h"
#include "render/stage_settings.h"

namespace velmora::render {

// Memory for the glow layer, kept so that frames of one size allocate once.
class GlowMemory {
  public:
    // At least `lanes` numbers of undefined value, or null when there is no memory. Ends what was there.
    [[nodiscard]] std::uint16_t* Reserve(std::uint64_t lanes) noexcept;

  private:
    std::unique_ptr<std::uint16_t[]> m_lanes;
    std::uint64_t m_size = 0;
};

// Rows of cells, `width` wide and with padding at either end.
struct CellPlane {
    CellRow base = nullptr;
    std::int32_t width = 0;
    std::int32_t height = 0;

    [[nodiscard]] std::ptrdiff_t Step() const noexcept {
        return (std::ptrdiff_t{width} + 2 * kCellPad) * kCellLanes;
    }
    [[nodiscard]] std::uint64_t Lanes() const noexcept {
        return (static_cast<std::uint64_t>(width) + 2 * kCellPad) * kCellLanes *
               static_cast<std::uint64_t>(height);
    }
    // The nearest row there is.
    [[nodiscard]] CellRow Row(std::int32_t y) const noexcept {
        const std::int32_t clamped = y < 0 ? 0 : y < height ? y : height - 1;
        return base + Step() * clamped + kCellPad * kCellLanes;
    }
};

class GlowStage {
  public:
    static constexpr bool kIsDamage = false;
    static std::uint32_t Draws(const StageSettings&, std::int32_t) noexcept { return 0; }
    GlowStage() noexcept = default;
    // A glow layer of one cell for 2^reduction × 2^reduction pixels; `rows` has two scratch rows, wide enough
    // for one cell for each pixel when the reduction is below 2, else for each fourth.
    GlowStage(const CellPlane& layer, int reduction, const CellPlane& rows,
              const GlowKernels& kernels) noexcept
        : m_layer(layer), m_rows(rows), m_reduction(reduction), m_kernels(&kernels) {}

    [[nodiscard]] bool IsActive() const noexcept { return m_kernels != nullptr; }
    // Row `y` of the processed rectangle; `in` may be `out`. Uses scratch rows in the memory that the stage was
    // prepared with, so rows of one picture are worked on one at a time.
    void Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;

  private:
    CellPlane m_layer;
    CellPlane m_rows;
    int m_reduction = 0;
    const GlowKernels* m_kernels = nullptr;
};

// Reads the whole picture, `width` × `height` pixels, and makes its glow layer for an amount in 0..1. Without
// anything to do or without memory the stage is not active. It points into `memory` and serves until the
// memory's next use.
[[nodiscard]] GlowStage PrepareGlow(float amount, const RowReader& input, std::int32_t width,
                                    std::int32_t height, GlowMemory& memory,
                                    const GlowKernels& kernels) noexcept;

}  // namespace velmora::render

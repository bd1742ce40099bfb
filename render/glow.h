// Glow ("Diffusion"): the effect of a mist filter in front of the lens. Highlights spread into a wide, soft glow
// layer with a radius proportional to the picture's height. The layer is screened over the picture, so the dark
// areas around a highlight get most of it. A picture without highlights is unchanged, no channel gets darker and
// alpha is kept.
//
// The glow layer is made from the whole picture before any row is processed. The highlights of a reduced picture
// (about 150 to 300 rows high) are blurred at three widths in a pyramid, in integers throughout. The cost does not
// depend on the radius, and hardly on the picture's contents.
#pragma once

#include <cstddef>
#include <cstdint>

#include "render/glow_kernels.h"
#include "render/growing_memory.h"
#include "render/image.h"
#include "render/stage_settings.h"

namespace velmora::render {

// The layer has at most this many rows of cells.
inline constexpr std::int32_t kMostGlowRows = 300;

// Of the three blurs in the glow layer.
inline constexpr double kGlowNarrowShare = 0.20;
inline constexpr double kGlowMiddleShare = 0.36;
inline constexpr double kGlowWideShare = 0.44;
inline constexpr double kGlowStrongest = 0.72;  // of the layer at amount 1

// The size halved `times` times, rounded up each time.
[[nodiscard]] constexpr std::int32_t ReducedSize(std::int32_t size, int times) noexcept {
    for (; times > 0; --times) size = size / 2 + size % 2;
    return size;
}

using GlowMemory = GrowingMemory<std::uint16_t>;

// Rows of cells, `width` wide, with padding at both ends.
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
    // `y` is clamped to the rows of the plane.
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
    // A glow layer with one cell for 2^reduction × 2^reduction pixels. `rows` has two scratch rows, wide enough for
    // one cell per pixel if the reduction is below 2, else for one cell per four pixels.
    GlowStage(const CellPlane& layer, int reduction, const CellPlane& rows,
              const GlowKernels& kernels) noexcept
        : m_layer(layer), m_rows(rows), m_reduction(reduction), m_kernels(&kernels) {}

    [[nodiscard]] bool IsActive() const noexcept { return m_kernels != nullptr; }
    // The layer over row `y` of the processed rectangle. It is made in scratch rows in the memory passed when the stage
    // was prepared, so only one row of a picture can be processed at a time.
    [[nodiscard]] GlowRow Over(std::int32_t width, std::int32_t y) const noexcept;
    // The same in planes, if the layer has a cell for four pixels or more.
    [[nodiscard]] bool HasPlanes() const noexcept { return m_reduction >= 2; }
    [[nodiscard]] GlowPlanes PlanesOver(std::int32_t width, std::int32_t y, SplitGlow split) const noexcept;
    // Processes row `y`; `in` may be `out`.
    void Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;

  private:
    // Rows of cells above and below a row of pixels, and the share of the farther one.
    struct Neighbours {
        ConstCellRow nearer, farther;  // near and far are words of Windows' headers
        std::int16_t share;
    };
    [[nodiscard]] Neighbours NeighboursOf(std::int32_t y) const noexcept;
    [[nodiscard]] static std::uint16_t Dither(std::int32_t y) noexcept;

    CellPlane m_layer;
    CellPlane m_rows;
    int m_reduction = 0;
    const GlowKernels* m_kernels = nullptr;
};

// Reads the whole picture, `width` × `height` pixels, and makes its glow layer for an amount in 0..1. The stage is
// inactive if there is nothing to do or not enough memory. It points into `memory` and is valid until the memory is
// used again.
[[nodiscard]] GlowStage PrepareGlow(float amount, const RowReader& input, std::int32_t width,
                                    std::int32_t height, GlowMemory& memory,
                                    const GlowKernels& kernels) noexcept;

// The filters of the glow layer's pyramid, in its levels 0, 2 and 4.
struct GlowLayerTaps {
    GlowTaps narrow, middle, wide;
};

// For a glow layer whose cells are `cell` pixels wide. The filters leave out the blur that reducing, halving and
// doubling add anyway.
[[nodiscard]] GlowLayerTaps MakeGlowLayerTaps(double height, double cell) noexcept;

}  // namespace velmora::render

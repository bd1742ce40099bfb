// The inner loops of the glow stage.
//
// They work on rows of cells. A cell is four 16-bit numbers: blue, green and red of one or more pixels, from 0 for
// black to kCellWhite, and an unused fourth. Rows have kCellPad cells of padding at both ends. A loop may read all
// of the padding. Its result depends only on the kContinued cells next to the row, and only where stated below. It
// may leave any values in the padding after the last cell that it writes.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "render/image.h"

namespace velmora::render {

using CellRow = std::uint16_t*;
using ConstCellRow = const std::uint16_t*;
inline constexpr std::int32_t kCellLanes = 4;
inline constexpr std::int32_t kCellPad = 8;
inline constexpr std::int32_t kContinued = 4;
inline constexpr std::int32_t kCellWhite = 255 * 128;  // 15 bits: sums of two still fit

// A symmetric filter: the middle weight and the weights of the pairs around it. They add up to 65536 at most.
struct GlowTaps {
    static constexpr int kMostPairs = 4;
    int pairs = 0;  // 2 or 4
    std::uint16_t middle = 0;
    std::array<std::uint16_t, kMostPairs> pair{};
};

// Highlights fade in above a luma floor of 0.36 of white and count in full from 0.9 of white. The weight between is
// 3t² − 2t³ (slightly less, to stay below 1), with t rising from 0 to 1. The excess is doubled and extended by a
// share of 65536 so that it fills 16 bits there. Pixels no brighter than the floor give no light, so a picture of
// such pixels is unchanged.
inline constexpr std::int32_t kHighlightFloor = 11750;
inline constexpr std::int32_t kHighlightStretch = 56302;
inline constexpr std::int32_t kLumaBlue = 29, kLumaGreen = 150, kLumaRed = 77;  // of 256

// Dither: screening rounds up by a share of 128 that differs from pixel to pixel, so that a faint halo thins out
// pixel by pixel instead of ending in rings. The share is the top bits of a 16-bit number that grows by the golden
// section of 65536 from pixel to pixel, so the shares of neighbouring pixels are spread evenly. All channels of a
// pixel use the same share, which keeps a grey halo grey.
inline constexpr std::uint16_t kDitherStep = 40503;
inline constexpr int kDitherShift = 9;

// The number of the pixel `x` columns after the one with the number `first`.
constexpr std::uint16_t DitherAt(std::uint16_t first, std::int32_t x) noexcept {
    return static_cast<std::uint16_t>(first + static_cast<std::uint32_t>(x) * kDitherStep);
}

struct GlowKernels {
    // Means of 4 × 4 pixels.
    void (*averageBlocks)(const Bgra* const rows[4], CellRow cells, std::int32_t count) noexcept;
    // Keeps only the highlights.
    void (*keepHighlights)(CellRow cells, std::int32_t count) noexcept;
    // Filters `count` cells: `middle` and the pairs (before[i], after[i]) around it. The pointers decide whether it
    // filters along a row or across rows.
    void (*filter)(ConstCellRow middle, const ConstCellRow* before, const ConstCellRow* after, CellRow out,
                   std::int32_t count, const GlowTaps& taps) noexcept;
    // The mean of four rows, weighted 1 3 3 1.
    void (*halveRows)(const ConstCellRow rows[4], CellRow out, std::int32_t count) noexcept;
    // The same along a row: `count` cells of `out` from twice as many. The ends of the input are continued by two
    // cells.
    void (*halveAlong)(ConstCellRow row, CellRow out, std::int32_t count) noexcept;
    // Three parts of one row and one part of another: the interpolation for doubling rows.
    void (*between)(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count) noexcept;
    // The same along a row: twice `count` cells of `out`. The ends of `row` are continued by one cell.
    void (*doubleAlong)(ConstCellRow row, CellRow out, std::int32_t count) noexcept;
    // out = out × ownShare + other × otherShare, with shares of 65536.
    void (*mix)(CellRow out, ConstCellRow other, std::int32_t count, std::uint16_t ownShare,
                std::uint16_t otherShare) noexcept;
    // Turns a blur v into the glow layer: 1 − (1 − v)⁴, times strength, of 65536. On film, light adds up before the
    // film's curve, which lifts the faint parts. This does the same to the surroundings of a highlight.
    void (*lift)(CellRow cells, std::int32_t count, std::uint16_t strength) noexcept;
    // near + (far − near) × share, a share of 65536 below a half.
    void (*approach)(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count,
                     std::int16_t share) noexcept;
    // Screens pixels with a glow layer of one cell per pixel, or of one cell per four pixels with its ends
    // continued. `dither` is the first pixel's number.
    void (*screen)(const Bgra* in, Bgra* out, ConstCellRow layer, std::int32_t width,
                   std::uint16_t dither) noexcept;
    void (*screenFourfold)(const Bgra* in, Bgra* out, ConstCellRow layer, std::int32_t width,
                           std::uint16_t dither) noexcept;
};

// A glow layer over a row of pixels.
struct GlowRow {
    const GlowKernels* kernels;
    ConstCellRow cells;   // with their ends continued
    std::int32_t pixels;  // per cell: 1 or 4
    std::uint16_t dither;

    // From column `x`, a multiple of `pixels`.
    [[nodiscard]] GlowRow From(std::int32_t x) const noexcept;
    void Screen(const Bgra* in, Bgra* out, std::int32_t width) const noexcept;
};

// The same with one cell per four pixels, by channels. Each plane continues its ends by one number; kernels may read
// kPlanesRead numbers after the last one.
struct GlowPlanes {
    const std::uint16_t* blue;
    const std::uint16_t* green;
    const std::uint16_t* red;
    std::uint16_t dither;

    // From column `x`, a multiple of four.
    [[nodiscard]] GlowPlanes From(std::int32_t x) const noexcept;
};
inline constexpr std::int32_t kPlanesRead = 64;

// As GlowKernels::approach, with the result separated into planes of blue, green and red.
using SplitGlow = void (*)(ConstCellRow near, ConstCellRow far, std::uint16_t* const planes[3],
                           std::int32_t count, std::int16_t share) noexcept;

}  // namespace velmora::render

// The inner loops of the glow stage.
//
// They work on rows of cells. A cell is four 16-bit numbers: blue, green and red of one or more pixels, 0 for
// black to kCellWhite, and a fourth that carries nothing. Rows have kCellPad cells of padding at either end. A
// loop may read all of it, uses none but the kContinued cells next to the row, where it says so, and may leave
// anything in the padding behind the last cell that it writes.
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

// A symmetric filter: the middle weight and those of the pairs around it, together 65536 at most.
struct GlowTaps {
    static constexpr int kMostPairs = 4;
    int pairs = 0;  // 2 or 4
    std::uint16_t middle = 0;
    std::array<std::uint16_t, kMostPairs> pair{};
};

// Highlights come in smoothly where luma is above the floor, 0.36 of white, and count in full from 0.9 of white
// on: by 3t² − 2t³ (a hair less, to stay below 1), t rising from 0 to 1 between. The excess is doubled and
// lengthened by a share of 65536, so that it fills 16 bits there. What is no brighter than the floor gives no
// light: a picture of it stays as it is.
inline constexpr std::int32_t kHighlightFloor = 11750;
inline constexpr std::int32_t kHighlightStretch = 56302;
inline constexpr std::int32_t kLumaBlue = 29, kLumaGreen = 150, kLumaRed = 77;  // of 256

// Screening rounds up by a share of 128 that differs from pixel to pixel, so that a faint halo fades by ever
// fewer pixels instead of ending in rings. The share is the top of a 16-bit number, which grows by the golden
// section of 65536 from one pixel to the next: any few neighbours have shares spread evenly. All channels of a
// pixel have the same one, which leaves a grey halo grey.
inline constexpr std::uint16_t kDitherStep = 40503;
inline constexpr int kDitherShift = 9;

struct GlowKernels {
    // Means of 4 × 4 pixels.
    void (*averageBlocks)(const Bgra* const rows[4], CellRow cells, std::int32_t count) noexcept;
    // Leaves what shines.
    void (*keepHighlights)(CellRow cells, std::int32_t count) noexcept;
    // Filters `count` cells: `middle` and the pairs (before[i], after[i]) around it. Along a row or across
    // rows, by where the pointers lead.
    void (*filter)(ConstCellRow middle, const ConstCellRow* before, const ConstCellRow* after, CellRow out,
                   std::int32_t count, const GlowTaps& taps) noexcept;
    // The mean of four rows, 1 3 3 1.
    void (*halveRows)(const ConstCellRow rows[4], CellRow out, std::int32_t count) noexcept;
    // The same along a row: `count` cells of `out` from twice as many, whose ends are continued by two.
    void (*halveAlong)(ConstCellRow row, CellRow out, std::int32_t count) noexcept;
    // Three parts of one row and one of another, as lies between cells when a row becomes two.
    void (*between)(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count) noexcept;
    // The same along a row: twice `count` cells of `out`; the ends of `row` are continued by a cell.
    void (*doubleAlong)(ConstCellRow row, CellRow out, std::int32_t count) noexcept;
    // out = out × ownShare + other × otherShare, shares of 65536.
    void (*mix)(CellRow out, ConstCellRow other, std::int32_t count, std::uint16_t ownShare,
                std::uint16_t otherShare) noexcept;
    // Makes a blur v the glow layer: 1 − (1 − v)⁴, times strength, of 65536. Light adds up before the film's
    // curve, which lifts the faint parts; this does the same to what surrounds a highlight.
    void (*lift)(CellRow cells, std::int32_t count, std::uint16_t strength) noexcept;
    // near + (far − near) × share, a share of 65536 below a half.
    void (*approach)(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count,
                     std::int16_t share) noexcept;
    // Screens pixels with a glow layer of one cell for a pixel, or for four; then its ends are continued.
    // `dither` is the first pixel's number.
    void (*screen)(const Bgra* in, Bgra* out, ConstCellRow layer, std::int32_t width,
                   std::uint16_t dither) noexcept;
    void (*screenFourfold)(const Bgra* in, Bgra* out, ConstCellRow layer, std::int32_t width,
                           std::uint16_t dither) noexcept;
};

}  // namespace velmora::render

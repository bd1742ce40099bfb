#include "render/glow.h"

#include <algorithm>

#include "render/random.h"
#include "render/rounding.h"

namespace velmora::render {
namespace {

// Continues a row with copies of its end cells.
void ContinueEnds(CellRow row, std::int32_t width) noexcept {
    for (std::int32_t i = 1; i <= kContinued; ++i) {
        std::copy_n(row, kCellLanes, row - i * kCellLanes);
        CellRow last = row + (width - 1) * std::ptrdiff_t{kCellLanes};
        std::copy_n(last, kCellLanes, last + i * kCellLanes);
    }
}

class GlowLayerMaker {
  public:
    GlowLayerMaker(double amount, const RowReader& input, std::int32_t width, std::int32_t height,
                   const GlowKernels& kernels) noexcept
        : m_input(input),
          m_width(width),
          m_height(height),
          m_kernels(kernels),
          m_strength(static_cast<std::uint16_t>(RoundHalfAway(kGlowStrongest * amount * 65535.0))) {
        while (ReducedSize(height, m_reduction) > kMostGlowRows) ++m_reduction;
    }

    [[nodiscard]] bool Allocate(GlowMemory& memory) noexcept;
    [[nodiscard]] GlowStage Make() noexcept;

  private:
    static constexpr int kLevels = 5;
    static constexpr int kMostReduction = 24;

    void ReadRow(int reduction, std::int32_t y, CellRow out) noexcept;
    void ReadBlocks(std::int32_t y, CellRow out) noexcept;
    void AverageCopies(const ShiftedRow (&rows)[4], std::int32_t first, std::int32_t end,
                       CellRow out) noexcept;
    void ReadSmallBlocks(int side, std::int32_t y, CellRow out) noexcept;
    void BlurAlong(CellRow row, CellRow out, std::int32_t width, const GlowTaps& taps) const noexcept;
    void BlurAcross(const CellPlane& from, const CellPlane& to, const GlowTaps& taps) const noexcept;
    void Blur(int level, const GlowTaps& taps) noexcept;
    void Halve(int level) noexcept;
    void AddDoubled(int level, double ownShare, double otherShare) noexcept;

    const RowReader& m_input;
    std::int32_t m_width;
    std::int32_t m_height;
    const GlowKernels& m_kernels;
    std::uint16_t m_strength;
    int m_reduction = 0;

    CellPlane m_levels[kLevels];
    CellPlane m_work[kLevels];           // of the same sizes
    CellPlane m_halves[kMostReduction];  // two rows each, of pictures reduced by more than four
    CellPlane m_rows;                    // two rows as wide as the widest
    Bgra* m_pixels = nullptr;            // four rows, with up to three more pixels
};

bool GlowLayerMaker::Allocate(GlowMemory& memory) noexcept {
    std::int32_t width = ReducedSize(m_width, m_reduction), height = ReducedSize(m_height, m_reduction);
    std::uint64_t lanes =
        (static_cast<std::uint64_t>(m_width) + 3) * 4 * (sizeof(Bgra) / sizeof(std::uint16_t));
    for (int level = 0; level < kLevels; ++level) {
        m_levels[level] = m_work[level] = {nullptr, width, height};
        lanes += 2 * m_levels[level].Lanes();
        width = ReducedSize(width, 1);
        height = ReducedSize(height, 1);
    }
    for (int reduction = 2; reduction < m_reduction; ++reduction) {
        m_halves[reduction] = {nullptr, ReducedSize(m_width, reduction), 2};
        lanes += m_halves[reduction].Lanes();
    }
    // A doubled row may be one cell wider than needed.
    m_rows = {nullptr, ReducedSize(m_width, std::min(m_reduction, 2) == 2 ? 2 : 0) + 1, 2};
    lanes += m_rows.Lanes() + kPlanesRead;

    std::uint16_t* next = memory.Reserve(lanes);
    if (next == nullptr) return false;
    const auto take = [&next](CellPlane& plane) {
        plane.base = next;
        next += plane.Lanes();
    };
    for (int level = 0; level < kLevels; ++level) {
        take(m_levels[level]);
        take(m_work[level]);
    }
    for (int reduction = 2; reduction < m_reduction; ++reduction) take(m_halves[reduction]);
    take(m_rows);
    m_pixels = reinterpret_cast<Bgra*>(next + kPlanesRead);
    return true;
}

// Row `y` of the picture reduced by 2^reduction.
void GlowLayerMaker::ReadRow(int reduction, std::int32_t y, CellRow out) noexcept {
    if (reduction < 2) return ReadSmallBlocks(1 << reduction, y, out);
    if (reduction == 2) return ReadBlocks(y, out);
    const CellPlane& halves = m_halves[reduction - 1];
    for (std::int32_t i = 0; i < 2; ++i) {
        const std::int32_t lastRow = ReducedSize(m_height, reduction - 1) - 1;
        ReadRow(reduction - 1, std::min(2 * y + i, lastRow), halves.Row(i));
        ContinueEnds(halves.Row(i), halves.width);
    }
    const std::int32_t lanes = ReducedSize(halves.width, 1) * kCellLanes;
    for (std::int32_t i = 0; i < lanes; ++i) {
        const std::int32_t left = i / kCellLanes * 2 * kCellLanes + i % kCellLanes;
        const int sum = halves.Row(0)[left] + halves.Row(0)[left + kCellLanes] + halves.Row(1)[left] +
                        halves.Row(1)[left + kCellLanes];
        out[i] = static_cast<std::uint16_t>((sum + 2) >> 2);
    }
}

// Blocks of 4 × 4 pixels; those at the right and bottom edges repeat the last pixels. Blocks of source pixels are read
// in place, those with a border from copies.
void GlowLayerMaker::ReadBlocks(std::int32_t y, CellRow out) noexcept {
    ShiftedRow rows[4];
    bool areAligned = true;
    for (std::int32_t i = 0; i < 4; ++i) {
        const std::int64_t row = std::min(std::int64_t{y} * 4 + i, std::int64_t{m_height} - 1);
        rows[i] = m_input.RowAt(static_cast<std::int32_t>(row));
        areAligned = areAligned && rows[i].start == rows[0].start && rows[i].count == rows[0].count;
    }
    const std::int32_t cells = m_width / 4 + (m_width % 4 != 0 ? 1 : 0);
    const std::int32_t first = areAligned ? (rows[0].start + 3) / 4 : cells;
    const std::int32_t after = std::max(first, areAligned ? (rows[0].start + rows[0].count) / 4 : cells);
    if (first != after) {
        const Bgra* pixels[4];
        for (int i = 0; i < 4; ++i) pixels[i] = rows[i].pixels + (4 * first - rows[i].start);
        m_kernels.averageBlocks(pixels, out + first * std::ptrdiff_t{kCellLanes}, after - first);
    }
    AverageCopies(rows, 0, std::min(first, cells), out);
    AverageCopies(rows, after, cells, out);
}

void GlowLayerMaker::AverageCopies(const ShiftedRow (&rows)[4], std::int32_t first, std::int32_t end,
                                   CellRow out) noexcept {
    if (first >= end) return;
    const std::int32_t columns = 4 * (end - first), read = std::min(columns, m_width - 4 * first);
    const Bgra* pixels[4];
    for (int i = 0; i < 4; ++i) {
        Bgra* const copy = m_pixels + (std::ptrdiff_t{m_width} + 3) * i;
        rows[i].Copy(4 * first, 4 * first + read, copy);
        std::fill(copy + read, copy + columns, copy[read - 1]);
        pixels[i] = copy;
    }
    m_kernels.averageBlocks(pixels, out + first * std::ptrdiff_t{kCellLanes}, end - first);
}

// One pixel per cell, or 2 × 2: in small pictures only.
void GlowLayerMaker::ReadSmallBlocks(int side, std::int32_t y, CellRow out) noexcept {
    const Bgra* rows[2];
    for (std::int32_t i = 0; i < 2; ++i) {
        const std::int32_t row = std::min(y * side + i * (side - 1), m_height - 1);
        const ShiftedRow shifted = m_input.RowAt(row);
        Bgra* const copy = m_pixels + std::ptrdiff_t{m_width} * i;
        if (shifted.count != m_width) shifted.Copy(0, m_width, copy);
        rows[i] = shifted.count != m_width ? copy : shifted.pixels;
    }
    // A single pixel counts four times.
    constexpr int kScale = 128 / 4;
    for (std::int32_t x = 0; x < m_width; x += side, out += kCellLanes) {
        const std::int32_t next = std::min(x + side - 1, m_width - 1);
        const Bgra &a = rows[0][x], &b = rows[0][next], &c = rows[1][x], &d = rows[1][next];
        out[0] = static_cast<std::uint16_t>((a.blue + b.blue + c.blue + d.blue) * kScale);
        out[1] = static_cast<std::uint16_t>((a.green + b.green + c.green + d.green) * kScale);
        out[2] = static_cast<std::uint16_t>((a.red + b.red + c.red + d.red) * kScale);
        out[3] = 0;
    }
}

void GlowLayerMaker::BlurAlong(CellRow row, CellRow out, std::int32_t width,
                               const GlowTaps& taps) const noexcept {
    ContinueEnds(row, width);
    ConstCellRow before[GlowTaps::kMostPairs], after[GlowTaps::kMostPairs];
    for (int i = 0; i < taps.pairs; ++i) {
        before[i] = row - (i + 1) * kCellLanes;
        after[i] = row + (i + 1) * kCellLanes;
    }
    m_kernels.filter(row, before, after, out, width, taps);
}

void GlowLayerMaker::BlurAcross(const CellPlane& from, const CellPlane& to,
                                const GlowTaps& taps) const noexcept {
    for (std::int32_t y = 0; y < to.height; ++y) {
        ConstCellRow before[GlowTaps::kMostPairs], after[GlowTaps::kMostPairs];
        for (int i = 0; i < taps.pairs; ++i) {
            before[i] = from.Row(y - i - 1);
            after[i] = from.Row(y + i + 1);
        }
        m_kernels.filter(from.Row(y), before, after, to.Row(y), to.width, taps);
    }
}

void GlowLayerMaker::Blur(int level, const GlowTaps& taps) noexcept {
    const CellPlane& plane = m_levels[level];
    for (std::int32_t y = 0; y < plane.height; ++y) {
        BlurAlong(plane.Row(y), m_work[level].Row(y), plane.width, taps);
    }
    BlurAcross(m_work[level], plane, taps);
}

// Makes the next level from this one.
void GlowLayerMaker::Halve(int level) noexcept {
    const CellPlane &from = m_levels[level], &to = m_levels[level + 1];
    CellRow narrowed = m_rows.Row(0);
    for (std::int32_t y = 0; y < to.height; ++y) {
        const ConstCellRow rows[4] = {from.Row(2 * y - 1), from.Row(2 * y), from.Row(2 * y + 1),
                                      from.Row(2 * y + 2)};
        m_kernels.halveRows(rows, narrowed, from.width);
        ContinueEnds(narrowed, from.width);
        m_kernels.halveAlong(narrowed, to.Row(y), to.width);
    }
}

// Adds the next level to this one. The last sum becomes the glow layer.
void GlowLayerMaker::AddDoubled(int level, double ownShare, double otherShare) noexcept {
    const CellPlane &fine = m_levels[level], &coarse = m_levels[level + 1];
    const auto share = [](double x) { return static_cast<std::uint16_t>(RoundHalfAway(x * 65535.0)); };
    for (std::int32_t y = 0; y < fine.height; ++y) {
        m_kernels.between(coarse.Row(y / 2), coarse.Row(y % 2 == 0 ? y / 2 - 1 : y / 2 + 1), m_rows.Row(0),
                          coarse.width);
        ContinueEnds(m_rows.Row(0), coarse.width);
        m_kernels.doubleAlong(m_rows.Row(0), m_rows.Row(1), coarse.width);
        m_kernels.mix(fine.Row(y), m_rows.Row(1), fine.width, share(ownShare), share(otherShare));
        if (level == 0) m_kernels.lift(fine.Row(y), fine.width, m_strength);
    }
}

GlowStage GlowLayerMaker::Make() noexcept {
    const GlowLayerTaps taps = MakeGlowLayerTaps(m_height, 1 << m_reduction);
    const CellPlane& layer = m_levels[0];
    for (std::int32_t y = 0; y < layer.height; ++y) {
        ReadRow(m_reduction, y, layer.Row(y));
        m_kernels.keepHighlights(layer.Row(y), layer.width);
        BlurAlong(layer.Row(y), m_work[0].Row(y), layer.width, taps.narrow);
    }
    BlurAcross(m_work[0], layer, taps.narrow);
    Halve(0);
    Halve(1);
    Blur(2, taps.middle);
    Halve(2);
    Halve(3);
    Blur(4, taps.wide);
    AddDoubled(3, 0.0, 1.0);
    AddDoubled(2, kGlowMiddleShare, kGlowWideShare);
    AddDoubled(1, 0.0, 1.0);
    AddDoubled(0, kGlowNarrowShare, 1.0);
    return {layer, m_reduction, m_rows, m_kernels};
}

}  // namespace

// A hash, so that rows form no pattern; it depends only on the row, so the result does not depend on how the work is
// divided.
std::uint16_t GlowStage::Dither(std::int32_t y) noexcept {
    return static_cast<std::uint16_t>(MixBits(static_cast<std::uint32_t>(y)));
}

// The row's distance from the middle of its cells decides the share of the neighbouring cells.
GlowStage::Neighbours GlowStage::NeighboursOf(std::int32_t y) const noexcept {
    const std::int32_t side = 1 << m_reduction;
    const std::int32_t cell = y >> m_reduction;
    const std::int32_t away = 2 * (y & (side - 1)) + 1 - side;  // in half pixels
    return {m_layer.Row(cell), m_layer.Row(away < 0 ? cell - 1 : cell + 1),
            static_cast<std::int16_t>(std::int64_t{std::abs(away)} * 32768 / side)};
}

GlowRow GlowStage::Over(std::int32_t width, std::int32_t y) const noexcept {
    CellRow row = m_rows.Row(0), other = m_rows.Row(1);
    const Neighbours from = NeighboursOf(y);
    m_kernels->approach(from.nearer, from.farther, row, m_layer.width, from.share);
    std::int32_t cells = m_layer.width;
    const int wanted = m_reduction < 2 ? 0 : 2;  // one cell per pixel, or per four pixels
    for (int reduction = m_reduction; reduction > wanted; --reduction) {
        ContinueEnds(row, cells);
        m_kernels->doubleAlong(row, other, cells);
        std::swap(row, other);
        cells = ReducedSize(width, reduction - 1);
    }
    ContinueEnds(row, cells);
    return {m_kernels, row, wanted == 0 ? 1 : 4, Dither(y)};
}

GlowPlanes GlowStage::PlanesOver(std::int32_t width, std::int32_t y, SplitGlow split) const noexcept {
    const std::int32_t cells = ReducedSize(width, 2);
    Neighbours from = NeighboursOf(y);
    // A row of finer cells is split as it is.
    if (m_reduction > 2) from.nearer = from.farther = Over(width, y).cells;
    const std::int32_t unused = from.nearer == m_rows.Row(0) ? 1 : 0;
    std::uint16_t* const first = m_rows.Row(unused);
    const std::ptrdiff_t step = std::ptrdiff_t{cells} + 2 * kCellPad;
    std::uint16_t* const planes[3] = {first, first + step, first + 2 * step};
    split(from.nearer, from.farther, planes, cells, from.share);
    for (std::uint16_t* plane : planes) {
        plane[-1] = plane[0];
        plane[cells] = plane[cells - 1];
    }
    return {planes[0], planes[1], planes[2], Dither(y)};
}

void GlowStage::Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    Over(width, y).Screen(in, out, width);
}

GlowStage PrepareGlow(float amount, const RowReader& input, std::int32_t width, std::int32_t height,
                      GlowMemory& memory, const GlowKernels& kernels) noexcept {
    if (!(amount > 0.0f) || width < 1 || height < 1) return {};
    GlowLayerMaker maker(std::min<double>(amount, 1.0), input, width, height, kernels);
    if (!maker.Allocate(memory)) return {};
    return maker.Make();
}

}  // namespace velmora::render

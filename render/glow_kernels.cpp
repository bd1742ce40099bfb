#include "render/glow_kernels.h"

#include <algorithm>

#include "render/kernels.h"

namespace velmora::render {
namespace {

constexpr std::uint32_t MulHigh(std::uint32_t a, std::uint32_t b) noexcept {
    return a * b >> 16;
}
constexpr std::uint32_t Mean(std::uint32_t a, std::uint32_t b) noexcept {
    return (a + b + 1) >> 1;
}
constexpr std::uint32_t ThreeToOne(std::uint32_t near, std::uint32_t far) noexcept {
    return Mean(near, Mean(near, far));
}
constexpr std::uint16_t Cell(std::uint32_t value) noexcept {
    return static_cast<std::uint16_t>(value);
}

void AverageBlocks(const Bgra* const rows[4], CellRow cells, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count; ++i, cells += kCellLanes) {
        std::uint32_t blue = 0, green = 0, red = 0;
        for (int y = 0; y < 4; ++y) {
            for (const Bgra *pixel = rows[y] + i * 4, *end = pixel + 4; pixel != end; ++pixel) {
                blue += pixel->blue;
                green += pixel->green;
                red += pixel->red;
            }
        }
        cells[0] = Cell(blue << 3);
        cells[1] = Cell(green << 3);
        cells[2] = Cell(red << 3);
        cells[3] = 0;
    }
}

void KeepHighlights(CellRow cells, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count; ++i, cells += kCellLanes) {
        const std::int32_t luma = (kLumaBlue * cells[0] + kLumaGreen * cells[1] + kLumaRed * cells[2]) >> 8;
        const std::uint32_t above = static_cast<std::uint32_t>(std::max(0, luma - kHighlightFloor)) * 2;
        const std::uint32_t t = std::min(above + MulHigh(above, kHighlightStretch), 65535u);
        const std::uint32_t share = MulHigh(MulHigh(t, t), 49151 - (t >> 1)) << 2;
        for (int c = 0; c < 3; ++c) cells[c] = Cell(MulHigh(cells[c], share));
        cells[3] = 0;
    }
}

void Filter(ConstCellRow middle, const ConstCellRow* before, const ConstCellRow* after, CellRow out,
            std::int32_t count, const GlowTaps& taps) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; ++i) {
        std::uint32_t sum = MulHigh(middle[i], taps.middle);
        for (int p = 0; p < taps.pairs; ++p) {
            sum += MulHigh(std::uint32_t{before[p][i]} + after[p][i], taps.pair[static_cast<std::size_t>(p)]);
        }
        out[i] = Cell(sum);
    }
}

void HalveRows(const ConstCellRow rows[4], CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; ++i) {
        out[i] = Cell(ThreeToOne(Mean(rows[1][i], rows[2][i]), Mean(rows[0][i], rows[3][i])));
    }
}

void HalveAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count; ++i, row += 2 * kCellLanes, out += kCellLanes) {
        for (int c = 0; c < kCellLanes; ++c) {
            out[c] = Cell(ThreeToOne(Mean(row[c], row[c + 4]), Mean(row[c - 4], row[c + 8])));
        }
    }
}

void Between(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; ++i) out[i] = Cell(ThreeToOne(near[i], far[i]));
}

void DoubleAlong(ConstCellRow row, CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count; ++i, row += kCellLanes, out += 2 * kCellLanes) {
        for (int c = 0; c < kCellLanes; ++c) {
            out[c] = Cell(ThreeToOne(row[c], row[c - 4]));
            out[c + 4] = Cell(ThreeToOne(row[c], row[c + 4]));
        }
    }
}

void Mix(CellRow out, ConstCellRow other, std::int32_t count, std::uint16_t ownShare,
         std::uint16_t otherShare) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; ++i) {
        out[i] = Cell(MulHigh(out[i], ownShare) + MulHigh(other[i], otherShare));
    }
}

constexpr std::uint32_t Lifted(std::uint32_t v) noexcept {
    return v + MulHigh(v * 2, 32767 - v);
}

void Lift(CellRow cells, std::int32_t count, std::uint16_t strength) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; ++i) {
        cells[i] = Cell(MulHigh(Lifted(Lifted(cells[i])), strength));
    }
}

std::int32_t Approached(std::int32_t near, std::int32_t far, std::int32_t share) noexcept {
    return near + ((far - near) * share >> 16);
}

void Approach(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count,
              std::int16_t share) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; ++i) {
        out[i] = static_cast<std::uint16_t>(Approached(near[i], far[i], share));
    }
}

// Never overflows, since no layer is much above three quarters. Where the layer is 0 the dither adds nothing.
std::uint8_t Screened(std::uint32_t channel, std::uint32_t layer, std::uint16_t dither) noexcept {
    const std::uint32_t added = ((255 - channel) * layer >> 8) + (dither >> kDitherShift);
    return static_cast<std::uint8_t>(channel + (added >> 7));
}

void Screen(const Bgra* in, Bgra* out, ConstCellRow layer, std::int32_t width,
            std::uint16_t dither) noexcept {
    for (std::int32_t x = 0; x < width; ++x, layer += kCellLanes) {
        const std::uint16_t own = DitherAt(dither, x);
        out[x] = {Screened(in[x].blue, layer[0], own), Screened(in[x].green, layer[1], own),
                  Screened(in[x].red, layer[2], own), in[x].alpha};
    }
}

void ScreenFourfold(const Bgra* in, Bgra* out, ConstCellRow layer, std::int32_t width,
                    std::uint16_t dither) noexcept {
    constexpr std::int16_t kShares[4] = {24576, 8192, 8192, 24576};  // 3/8 and 1/8 of the way to a neighbour
    for (std::int32_t x = 0; x < width; ++x) {
        const ConstCellRow near = layer + x / 4 * kCellLanes;
        const ConstCellRow far = x % 4 < 2 ? near - kCellLanes : near + kCellLanes;
        std::uint16_t cell[kCellLanes];
        Approach(near, far, cell, 1, kShares[x % 4]);
        Screen(in + x, out + x, cell, 1, DitherAt(dither, x));
    }
}

}  // namespace

const GlowKernels kPlainGlow = {AverageBlocks, KeepHighlights, Filter,      HalveRows,
                                HalveAlong,    Between,        DoubleAlong, Mix,
                                Lift,          Approach,       Screen,      ScreenFourfold};

GlowRow GlowRow::From(std::int32_t x) const noexcept {
    GlowRow rest = *this;
    rest.cells += std::ptrdiff_t{x / pixels} * kCellLanes;
    rest.dither = DitherAt(dither, x);
    return rest;
}

void GlowRow::Screen(const Bgra* in, Bgra* out, std::int32_t width) const noexcept {
    (pixels == 1 ? kernels->screen : kernels->screenFourfold)(in, out, cells, width, dither);
}

GlowPlanes GlowPlanes::From(std::int32_t x) const noexcept {
    return {blue + x / 4, green + x / 4, red + x / 4, DitherAt(dither, x)};
}

}  // namespace velmora::render

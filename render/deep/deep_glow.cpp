#include "render/deep/deep_glow.h"

#include <algorithm>
#include <cstdlib>

#include "render/glow.h"

namespace velmora::render {
namespace {

void ContinueEnds(float* row, std::int32_t width) noexcept {
    for (std::int32_t i = 1; i <= kContinued; ++i) {
        row[-i] = row[0];
        row[width - 1 + i] = row[width - 1];
    }
}

DeepTaps TapsOf(const GlowTaps& taps) noexcept {
    DeepTaps result;
    result.pairs = taps.pairs;
    result.middle = static_cast<float>(taps.middle / 65536.0);
    for (std::size_t i = 0; i < taps.pair.size(); ++i)
        result.pair[i] = static_cast<float>(taps.pair[i] / 65536.0);
    return result;
}

class DeepLayerMaker {
  public:
    DeepLayerMaker(double amount, const DeepBlockReader& input, std::int32_t width, std::int32_t height,
                   const DeepGlowKernels& kernels) noexcept
        : m_input(input),
          m_width(width),
          m_height(height),
          m_kernels(kernels),
          m_strength(static_cast<float>(kGlowStrongest * amount)) {
        while (ReducedSize(height, m_reduction) > kMostGlowRows) ++m_reduction;
    }

    [[nodiscard]] bool Allocate(GrowingMemory<float>& memory) noexcept;
    [[nodiscard]] DeepGlow Make() noexcept;

  private:
    static constexpr int kLevels = 5;
    static constexpr int kMostReduction = 24;

    void ReadRow(int reduction, std::int32_t y, const DeepCells& out, std::int32_t outRow) noexcept;
    void ReadBlocks(std::int32_t y, const DeepCells& out, std::int32_t outRow) noexcept;
    void ReadSmallBlocks(int side, std::int32_t y, const DeepCells& out, std::int32_t outRow) noexcept;
    void BlurAlong(const DeepCells& from, const DeepCells& to, std::int32_t y,
                   const DeepTaps& taps) const noexcept;
    void BlurAcross(const DeepCells& from, const DeepCells& to, const DeepTaps& taps) const noexcept;
    void Blur(int level, const DeepTaps& taps) noexcept;
    void Halve(int level) noexcept;
    void AddDoubled(int level, double ownShare, double otherShare) noexcept;

    const DeepBlockReader& m_input;
    std::int32_t m_width;
    std::int32_t m_height;
    const DeepGlowKernels& m_kernels;
    float m_strength;
    int m_reduction = 0;

    DeepCells m_levels[kLevels];
    DeepCells m_work[kLevels];           // of the same sizes
    DeepCells m_halves[kMostReduction];  // two rows each, of pictures reduced by more than four
    DeepCells m_rows;                    // two rows as wide as the widest
};

bool DeepLayerMaker::Allocate(GrowingMemory<float>& memory) noexcept {
    std::int32_t width = ReducedSize(m_width, m_reduction), height = ReducedSize(m_height, m_reduction);
    std::uint64_t size = 0;
    const auto plan = [&size](DeepCells& cells, std::int32_t w, std::int32_t h) {
        cells = {nullptr, w, h};
        size += cells.Size();
    };
    for (int level = 0; level < kLevels; ++level) {
        plan(m_levels[level], width, height);
        plan(m_work[level], width, height);
        width = ReducedSize(width, 1);
        height = ReducedSize(height, 1);
    }
    for (int reduction = 2; reduction < m_reduction; ++reduction) {
        plan(m_halves[reduction], ReducedSize(m_width, reduction), 2);
    }
    // A doubled row may be one cell wider than needed.
    plan(m_rows, ReducedSize(m_width, std::min(m_reduction, 2) == 2 ? 2 : 0) + 1, 2);

    float* next = memory.Reserve(size);
    if (next == nullptr) return false;
    const auto take = [&next](DeepCells& cells) {
        cells.base = next;
        next += cells.Size();
    };
    for (int level = 0; level < kLevels; ++level) {
        take(m_levels[level]);
        take(m_work[level]);
    }
    for (int reduction = 2; reduction < m_reduction; ++reduction) take(m_halves[reduction]);
    take(m_rows);
    return true;
}

// Row `y` of the picture reduced by 2^reduction.
void DeepLayerMaker::ReadRow(int reduction, std::int32_t y, const DeepCells& out,
                             std::int32_t outRow) noexcept {
    if (reduction < 2) return ReadSmallBlocks(1 << reduction, y, out, outRow);
    if (reduction == 2) return ReadBlocks(y, out, outRow);
    const DeepCells& halves = m_halves[reduction - 1];
    for (std::int32_t i = 0; i < 2; ++i) {
        const std::int32_t lastRow = ReducedSize(m_height, reduction - 1) - 1;
        ReadRow(reduction - 1, std::min(2 * y + i, lastRow), halves, i);
    }
    const std::int32_t count = ReducedSize(halves.width, 1);
    for (int c = 0; c < 3; ++c) {
        float *first = halves.Row(0, c), *second = halves.Row(1, c), *cells = out.Row(outRow, c);
        ContinueEnds(first, halves.width);
        ContinueEnds(second, halves.width);
        for (std::int32_t i = 0; i < count; ++i) {
            cells[i] = ((first[2 * i] + first[2 * i + 1]) + (second[2 * i] + second[2 * i + 1])) * 0.25f;
        }
    }
}

// Means of blocks of 4 × 4 pixels; those at the right and bottom edges repeat the last pixels. Each row is read at a
// stretch: memory takes twice as long for parts of four rows in turn.
void DeepLayerMaker::ReadBlocks(std::int32_t y, const DeepCells& out, std::int32_t outRow) noexcept {
    DeepBlock sums;
    float* const channels[] = {sums.red, sums.green, sums.blue};
    for (std::int32_t i = 0; i < 4; ++i) {
        const auto line =
            static_cast<std::int32_t>(std::min(std::int64_t{y} * 4 + i, std::int64_t{m_height} - 1));
        for (std::int32_t from = 0; from < m_width; from += kDeepBlock) {
            const std::int32_t count = std::min(kDeepBlock, m_width - from), cells = (count + 3) / 4;
            m_input.ReadSixteenths(line, from, count, sums);
            for (int c = 0; c < 3; ++c) {
                float* const target = out.Row(outRow, c) + from / 4;
                if (i == 0) {
                    std::copy_n(channels[c], cells, target);
                } else {
                    m_kernels.add(target, channels[c], cells);
                }
            }
        }
    }
}

// The same of 1 pixel, or 2 × 2: in small pictures only.
void DeepLayerMaker::ReadSmallBlocks(int side, std::int32_t y, const DeepCells& out,
                                     std::int32_t outRow) noexcept {
    DeepBlock rows[2];
    for (std::int32_t from = 0; from < m_width; from += kDeepBlock) {
        const std::int32_t count = std::min(kDeepBlock, m_width - from);
        for (std::int32_t i = 0; i < side; ++i)
            m_input.Read(std::min(y * side + i, m_height - 1), from, count, rows[i]);
        for (int c = 0; c < 3; ++c) {
            float* const target = out.Row(outRow, c) + from / side;
            const auto pixel = [&](std::int32_t x, int i) {
                const DeepBlock& row = rows[i];
                const float* const channel = c == 0 ? row.red : c == 1 ? row.green : row.blue;
                return channel[std::min(x, count - 1)];
            };
            for (std::int32_t x = 0; x < count; x += side) {
                target[x / side] =
                    side == 1 ? pixel(x, 0)
                              : ((pixel(x, 0) + pixel(x, 1)) + (pixel(x + 1, 0) + pixel(x + 1, 1))) * 0.25f;
            }
        }
    }
}

void DeepLayerMaker::BlurAlong(const DeepCells& from, const DeepCells& to, std::int32_t y,
                               const DeepTaps& taps) const noexcept {
    for (int c = 0; c < 3; ++c) {
        float* const row = from.Row(y, c);
        ContinueEnds(row, from.width);
        const float *before[DeepTaps::kMostPairs], *after[DeepTaps::kMostPairs];
        for (int i = 0; i < taps.pairs; ++i) {
            before[i] = row - (i + 1);
            after[i] = row + (i + 1);
        }
        m_kernels.filter(row, before, after, to.Row(y, c), from.width, taps);
    }
}

void DeepLayerMaker::BlurAcross(const DeepCells& from, const DeepCells& to,
                                const DeepTaps& taps) const noexcept {
    for (std::int32_t y = 0; y < to.height; ++y) {
        for (int c = 0; c < 3; ++c) {
            const float *before[DeepTaps::kMostPairs], *after[DeepTaps::kMostPairs];
            for (int i = 0; i < taps.pairs; ++i) {
                before[i] = from.Row(y - i - 1, c);
                after[i] = from.Row(y + i + 1, c);
            }
            m_kernels.filter(from.Row(y, c), before, after, to.Row(y, c), to.width, taps);
        }
    }
}

void DeepLayerMaker::Blur(int level, const DeepTaps& taps) noexcept {
    const DeepCells& cells = m_levels[level];
    for (std::int32_t y = 0; y < cells.height; ++y) BlurAlong(cells, m_work[level], y, taps);
    BlurAcross(m_work[level], cells, taps);
}

// Makes the next level from this one.
void DeepLayerMaker::Halve(int level) noexcept {
    const DeepCells &from = m_levels[level], &to = m_levels[level + 1];
    float* const narrowed = m_rows.Row(0, 0);
    for (std::int32_t y = 0; y < to.height; ++y) {
        for (int c = 0; c < 3; ++c) {
            const float* const rows[4] = {from.Row(2 * y - 1, c), from.Row(2 * y, c), from.Row(2 * y + 1, c),
                                          from.Row(2 * y + 2, c)};
            m_kernels.halveRows(rows, narrowed, from.width);
            ContinueEnds(narrowed, from.width);
            m_kernels.halveAlong(narrowed, to.Row(y, c), to.width);
        }
    }
}

// Adds the next level to this one. The last sum becomes the glow layer.
void DeepLayerMaker::AddDoubled(int level, double ownShare, double otherShare) noexcept {
    const DeepCells &fine = m_levels[level], &coarse = m_levels[level + 1];
    float *const between = m_rows.Row(0, 0), *const doubled = m_rows.Row(1, 0);
    for (std::int32_t y = 0; y < fine.height; ++y) {
        for (int c = 0; c < 3; ++c) {
            const float* const far = coarse.Row(y % 2 == 0 ? y / 2 - 1 : y / 2 + 1, c);
            m_kernels.approach(coarse.Row(y / 2, c), far, between, coarse.width, 0.25f);
            ContinueEnds(between, coarse.width);
            m_kernels.doubleAlong(between, doubled, coarse.width);
            m_kernels.mix(fine.Row(y, c), doubled, fine.width, static_cast<float>(ownShare),
                          static_cast<float>(otherShare));
            if (level == 0) m_kernels.lift(fine.Row(y, c), fine.width, m_strength);
        }
    }
}

DeepGlow DeepLayerMaker::Make() noexcept {
    const GlowLayerTaps taps = MakeGlowLayerTaps(m_height, 1 << m_reduction);
    const DeepTaps narrow = TapsOf(taps.narrow);
    const DeepCells& layer = m_levels[0];
    for (std::int32_t y = 0; y < layer.height; ++y) {
        ReadRow(m_reduction, y, layer, y);
        m_kernels.keepHighlights(layer.Row(y, 0), layer.Row(y, 1), layer.Row(y, 2), layer.width);
        BlurAlong(layer, m_work[0], y, narrow);
    }
    BlurAcross(m_work[0], layer, narrow);
    Halve(0);
    Halve(1);
    Blur(2, TapsOf(taps.middle));
    Halve(2);
    Halve(3);
    Blur(4, TapsOf(taps.wide));
    AddDoubled(3, 0.0, 1.0);
    AddDoubled(2, kGlowMiddleShare, kGlowWideShare);
    AddDoubled(1, 0.0, 1.0);
    AddDoubled(0, kGlowNarrowShare, 1.0);
    return {layer, m_reduction, m_rows, m_kernels};
}

}  // namespace

// The interpolation is that of GlowStage::Row.
void DeepGlow::BeginRow(std::int32_t width, std::int32_t y) noexcept {
    const std::int32_t side = 1 << m_reduction;
    const std::int32_t cell = y >> m_reduction;
    const std::int32_t away = 2 * (y & (side - 1)) + 1 - side;
    const auto share = static_cast<float>(std::abs(away) / (2.0 * side));
    const int wanted = m_reduction < 2 ? 0 : 2;  // one cell per pixel, or per four pixels
    m_row = 0;
    for (int c = 0; c < 3; ++c) {
        m_kernels->approach(m_layer.Row(cell, c), m_layer.Row(away < 0 ? cell - 1 : cell + 1, c),
                            m_rows.Row(0, c), m_layer.width, share);
    }
    std::int32_t cells = m_layer.width;
    for (int reduction = m_reduction; reduction > wanted; --reduction) {
        for (int c = 0; c < 3; ++c) {
            ContinueEnds(m_rows.Row(m_row, c), cells);
            m_kernels->doubleAlong(m_rows.Row(m_row, c), m_rows.Row(1 - m_row, c), cells);
        }
        m_row = 1 - m_row;
        cells = ReducedSize(width, reduction - 1);
    }
    for (int c = 0; c < 3; ++c) ContinueEnds(m_rows.Row(m_row, c), cells);
}

void DeepGlow::Screen(DeepBlock& block, std::int32_t from, std::int32_t count) const noexcept {
    alignas(64) float layer[kDeepBlock + 64];
    const std::int32_t into = from % 4;  // the first cell
    float* const channels[] = {block.red, block.green, block.blue};
    for (int c = 0; c < 3; ++c) {
        const float* const row = m_rows.Row(m_row, c);
        if (m_reduction < 2) {
            m_kernels->screen(channels[c], row + from, count);
        } else {
            m_kernels->spread(row + from / 4, layer, (into + count + 3) / 4);
            m_kernels->screen(channels[c], layer + into, count);
        }
    }
}

DeepGlow PrepareDeepGlow(float amount, const DeepBlockReader& input, std::int32_t width, std::int32_t height,
                         GrowingMemory<float>& memory, const DeepGlowKernels& kernels) noexcept {
    if (!(amount > 0.0f) || width < 1 || height < 1) return {};
    DeepLayerMaker maker(std::min<double>(amount, 1.0), input, width, height, kernels);
    if (!maker.Allocate(memory)) return {};
    return maker.Make();
}

}  // namespace velmora::render

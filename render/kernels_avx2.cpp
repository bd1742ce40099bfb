// The kernels with AVX2.

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <span>
#include <type_traits>

#include "render/glow_kernels.h"
#include "render/kernels.h"
#include "render/simd/target.h"
#include "render/ycbcr.h"

#if VM_HAS_AVX2
VM_BEGIN_TARGET("avx2")

namespace velmora::render {
namespace {

#include "render/simd/avx2.h"

#include "render/simd/rows.inc"
#include "render/simd/wear.inc"
#include "render/simd/tone_lines.inc"
#include "render/simd/channels.inc"
#include "render/simd/mix.inc"
#include "render/simd/mix_channels.inc"
#include "render/simd/table_shuffles.inc"
#include "render/simd/glow_channels.inc"
#include "render/simd/tone_channels.inc"
#include "render/simd/glow.inc"

// Rows of the glow layer, separated into channels for glow_channels.inc.

// Two cells for each block, grouped by channels. A block's cells are eight after those of the block before.
inline Vec CellPairs(ConstCellRow near, ConstCellRow far, Vec share) noexcept {
    constexpr std::ptrdiff_t kStep = 8 * kCellBytes;
    const Vec cells = Approached(LoadBlocks(near, kStep), LoadBlocks(far, kStep), share);
    return ShuffleBytes(cells, EachBlock(0x0B0A030209080100, 0x0F0E07060D0C0504));
}

void SplitCells(ConstCellRow near, ConstCellRow far, std::uint16_t* const planes[3], std::int32_t count,
                std::int16_t share) noexcept {
    constexpr std::int32_t kStep = 8 * kBlocks;
    const Vec shares = All16(share);
    std::int32_t i = 0;
    for (; i + kStep <= count; i += kStep) {
        Block b;
        for (int k = 0; k < 4; ++k) {
            const std::ptrdiff_t at = std::ptrdiff_t{i + 2 * k} * kCellLanes;
            b.v[k] = CellPairs(near + at, far + at, shares);
        }
        Transpose(b);
        for (int c = 0; c < 3; ++c) Store(planes[c] + i, b.v[c]);
    }
    for (; i < count; ++i) {
        std::uint16_t cell[kCellLanes];
        const std::ptrdiff_t at = std::ptrdiff_t{i} * kCellLanes;
        kPlainKernels.glow->approach(near + at, far + at, cell, 1, share);
        for (int c = 0; c < 3; ++c) planes[c][i] = cell[c];
    }
}

#include "render/simd/ycbcr.inc"

}  // namespace

void SplitGlowAvx2(ConstCellRow near, ConstCellRow far, std::uint16_t* const planes[3], std::int32_t count,
                   std::int16_t share) noexcept {
    SplitCells(near, far, planes, count, share);
}

namespace {
constexpr GlowedTone kGlowedTone = {SplitGlowAvx2, ToneUnderGlow};
}  // namespace

const GlowKernels kAvx2Glow = kGlow;

const Kernels kAvx2Kernels = {ToneRow,         WearRow,    CopyRow, StreamRow,   EndStream,
                              &kSse2Scratches, &kAvx2Glow, &kYcbcr, &kGlowedTone};

}  // namespace velmora::render

VM_END_TARGET
#endif

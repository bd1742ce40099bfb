// The row operations of deep pictures. There is one source (deep_kernels.inc), compiled for each SIMD level; all levels
// do the same arithmetic in the same order and so give the same bytes.
#pragma once

#include <cstdint>

#include "render/deep/deep_block.h"
#include "render/deep/deep_tone.h"
#include "render/simd/level.h"

namespace velmora::render {

// Weights of a symmetric filter: the middle and the pairs around it, from the middle outward.
struct DeepTaps {
    static constexpr int kMostPairs = 4;
    int pairs = 0;
    float middle = 0.0f;
    float pair[kMostPairs] = {};
};

// Rows of one channel of the glow layer, with kCellPad numbers of padding at both ends. See GlowKernels
// (render/glow_kernels.h), which do the same in integers.
struct DeepGlowKernels {
    // Adds a row, or the sum of each four neighbours of a row.
    void (*add)(float* out, const float* row, std::int32_t count) noexcept;
    void (*sumFours)(const float* row, float* out, std::int32_t count, float times) noexcept;
    void (*keepHighlights)(float* red, float* green, float* blue, std::int32_t count) noexcept;
    void (*filter)(const float* middle, const float* const* before, const float* const* after, float* out,
                   std::int32_t count, const DeepTaps& taps) noexcept;
    void (*halveRows)(const float* const rows[4], float* out, std::int32_t count) noexcept;
    void (*halveAlong)(const float* row, float* out, std::int32_t count) noexcept;
    void (*doubleAlong)(const float* row, float* out, std::int32_t count) noexcept;
    void (*mix)(float* out, const float* other, std::int32_t count, float ownShare,
                float otherShare) noexcept;
    void (*lift)(float* cells, std::int32_t count, float strength) noexcept;
    void (*approach)(const float* near, const float* far, float* out, std::int32_t count,
                     float share) noexcept;
    // Four numbers for each of `count` cells.
    void (*spread)(const float* cells, float* out, std::int32_t count) noexcept;
    void (*screen)(float* channel, const float* layer, std::int32_t count) noexcept;
};

struct DeepKernels {
    // Between pixels and the planes of a block from place `at` on, by DeepSamples and by channels - 3.
    void (*load[2][2])(const void* pixels, DeepBlock& block, std::int32_t at, std::int32_t count) noexcept;
    void (*store[2][2])(const DeepBlock& block, std::int32_t at, void* pixels, std::int32_t count) noexcept;
    // By alpha, for premultiplied pictures.
    void (*divide)(DeepBlock& block, std::int32_t at, std::int32_t count) noexcept;
    void (*multiply)(DeepBlock& block, std::int32_t at, std::int32_t count) noexcept;
    void (*tone)(DeepBlock& block, std::int32_t count, const DeepTone& tone) noexcept;
    // Lightens a channel by `amount` under a byte of 255.
    void (*wear)(float* channel, const std::uint8_t* bytes, std::int32_t count, float amount) noexcept;
    DeepGlowKernels glow;
};

// The kernels of the level, or of the next lower one that there is.
[[nodiscard]] const DeepKernels& DeepKernelsOf(SimdLevel level) noexcept;

extern const DeepKernels kDeepPlainKernels;
extern const DeepKernels kDeepAvx2Kernels;

}  // namespace velmora::render

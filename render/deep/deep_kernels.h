// The row operations of deep pictures. There is one source (deep_kernels.inc), compiled with the vectors of each SIMD
// level; all levels do the same arithmetic in the same order and so give the same bytes.
//
// Blocks and rows of floats are written up to the end of a vector, at most 15 numbers (30 when doubled) beyond the last.
#pragma once

#include <cstdint>

#include "render/deep/deep_tone.h"
#include "render/simd/level.h"

namespace velmora::render {

// A part of a row on its way through the stages: one plane of floats for each channel. It is small enough for the
// first-level cache, and for reads and writes of memory to go on while a block is worked on. Colours are 0 for black and
// 1 for white, not multiplied by alpha, and may be outside. Never NaN or infinite.
inline constexpr std::int32_t kDeepBlock = 256;  // pixels; a multiple of the glow's cells
struct DeepBlock {
    static constexpr std::int32_t kPad = 16;  // kernels may write whole vectors

    alignas(64) float red[kDeepBlock + kPad];
    alignas(64) float green[kDeepBlock + kPad];
    alignas(64) float blue[kDeepBlock + kPad];
    alignas(64) float alpha[kDeepBlock + kPad];
    // All colours are known to be within 0..1, which saves work. What the stages make of a pixel does not depend on it.
    bool isInside = true;
};

// Weights of a symmetric filter: the middle and the pairs around it, from the middle outward.
struct DeepTaps {
    static constexpr int kMostPairs = 4;
    int pairs = 0;
    float middle = 0.0f;
    float pair[kMostPairs] = {};
};

// Rows of one channel of the glow layer, with padding at both ends. See GlowKernels
// (render/glow_kernels.h), which do the same in integers.
struct DeepGlowKernels {
    // Adds a row; a sixteenth of the sum of each four neighbours of a row.
    void (*add)(float* out, const float* row, std::int32_t count) noexcept;
    void (*sixteenths)(const float* row, float* out, std::int32_t count) noexcept;
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
    // Between pixels and the planes of a block from place `at` on, by DeepSamples and by channels - 3. Loading what is
    // not within 0..1 takes back `isInside`.
    void (*load[2][2])(const void* pixels, DeepBlock& block, std::int32_t at, std::int32_t count) noexcept;
    // A sixteenth of the sum of each four pixels of four channels, `count` of them from place `at` on. False if they
    // are of no use, since not all pixels are within 0..1.
    bool (*loadSixteenths[2])(const void* pixels, DeepBlock& block, std::int32_t at,
                              std::int32_t count) noexcept;
    void (*store[2][2])(const DeepBlock& block, std::int32_t at, void* pixels, std::int32_t count) noexcept;
    // Stores the first pixels of a block as four floats, bypassing the caches if the level can. `pixels` is at a multiple
    // of 16 bytes, or better of 64.
    // After the last row of a frame, `endStream` makes them visible to other threads.
    void (*stream)(const DeepBlock& block, void* pixels, std::int32_t count) noexcept;
    void (*endStream)() noexcept;
    // By alpha, for premultiplied pictures.
    void (*divide)(DeepBlock& block, std::int32_t at, std::int32_t count) noexcept;
    void (*multiply)(DeepBlock& block, std::int32_t at, std::int32_t count) noexcept;
    void (*tone)(DeepBlock& block, std::int32_t count, const DeepTone& tone) noexcept;
    // Lightens the block's first pixels by `amount` under a byte of 255.
    void (*wear)(DeepBlock& block, const std::uint8_t* bytes, std::int32_t count, float amount,
                 bool blueOnly) noexcept;
    // Moves a channel toward a level by shares, which are 0 to the end of the last vector, less half a level of 255 for
    // the truncation in 8 bits.
    void (*scratch)(float* channel, const float* shares, std::int32_t count, float towards,
                    bool isWhite) noexcept;
    // By LightCurve (render/deep/light.h), in place.
    void (*toDisplay[2])(float* numbers, std::int32_t count) noexcept;
    void (*toLight[2])(float* numbers, std::int32_t count) noexcept;
    DeepGlowKernels glow;
};

// The kernels of the level, or of the next lower one that there is.
[[nodiscard]] const DeepKernels& DeepKernelsOf(SimdLevel level) noexcept;

extern const DeepKernels kDeepPlainKernels;
extern const DeepKernels kDeepSse2Kernels;
extern const DeepKernels kDeepAvx2Kernels;
extern const DeepKernels kDeepAvx512Kernels;

}  // namespace velmora::render

// A part of a row on its way through the stages: one plane of floats for each channel, small enough for the
// first-level cache.
#pragma once

#include <cstdint>

namespace velmora::render {

inline constexpr std::int32_t kDeepBlock = 512;  // pixels; a multiple of the glow's cells

// Colours are 0 for black and 1 for white, not multiplied by alpha, and may be outside. Never NaN or infinite.
struct DeepBlock {
    static constexpr std::int32_t kPad = 16;  // kernels may write whole vectors

    alignas(64) float red[kDeepBlock + kPad];
    alignas(64) float green[kDeepBlock + kPad];
    alignas(64) float blue[kDeepBlock + kPad];
    alignas(64) float alpha[kDeepBlock + kPad];
};

}  // namespace velmora::render

// The loops of the conversion over one row. The samples in between are floats, added and multiplied in a fixed order
// and never fused, so every SIMD level gives the same bytes.
#pragma once

#include <cstddef>
#include <cstdint>

#include "render/simd/level.h"

namespace velmora::hosts {

constexpr std::size_t kMostTaps = 16;

// Rows of code numbers, one each for Y, Cb, Cr or red, green, blue. `alpha` may be null.
template <class Float>
struct ColourRows {
    Float* first;
    Float* second;
    Float* third;
    Float* alpha;
};

// From code numbers: channel i (red, green, blue) is the sum of weight[i][k] * code k, and plus[i].
// From channels: code k is the sum of weight[k][i] * channel i; `plus` is not used.
// Alpha is multiplied by `alpha`, and `alphaPlus` is added.
struct RowMatrix {
    float weight[3][3];
    float plus[3];
    float alpha, alphaPlus;
};

struct RowKernels {
    void (*readBytes)(const std::uint8_t* in, float* out, std::int32_t count) noexcept;
    void (*readWords)(const std::uint16_t* in, float* out, std::int32_t count) noexcept;
    // Add `plus`, limit to 0..`highest` and truncate.
    void (*writeBytes)(const float* in, std::uint8_t* out, std::int32_t count, float plus,
                       float highest) noexcept;
    void (*writeWords)(const float* in, std::uint16_t* out, std::int32_t count, float plus,
                       float highest) noexcept;

    // out[i] = sum of rows[k][i] * weights[k]; one for each number of taps from 1.
    using WeightedSum = void (*)(const float* const* rows, const float* weights, float* out,
                                 std::int32_t count) noexcept;
    WeightedSum weightedSums[kMostTaps];
    // even[i], odd[i] and out[2 * i], out[2 * i + 1], for `pairs` of them.
    void (*interleave)(const float* even, const float* odd, float* out, std::int32_t pairs) noexcept;
    void (*separate)(const float* in, float* even, float* odd, std::int32_t pairs) noexcept;

    // Pixels are limited to their range and truncated, except floats. Null `alpha` gives opaque pixels.
    using ToPixels = void (*)(const ColourRows<const float>& in, const RowMatrix& matrix, void* pixels,
                              std::int32_t count) noexcept;
    ToPixels toBytes;  // BGRA
    ToPixels toWords;  // RGBA
    ToPixels toFloats;
    using FromPixels = void (*)(const void* pixels, const RowMatrix& matrix, const ColourRows<float>& out,
                                std::int32_t count) noexcept;
    FromPixels fromBytes, fromWords, fromFloats;
};

const RowKernels& RowKernelsOf(render::SimdLevel level) noexcept;

// The levels that are faster than what the compiler makes of the plain loops.
extern const RowKernels kPlainRowKernels, kAvx2RowKernels, kAvx512RowKernels;

}  // namespace velmora::hosts

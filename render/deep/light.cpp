#include "render/deep/light.h"

#include <algorithm>
#include <cstddef>

#include "render/deep/deep_kernels.h"

namespace velmora::render {
namespace {

using Convert = void (*)(float* numbers, std::int32_t count) noexcept;

// The kernels work on whole vectors; the last numbers go through one with padding.
void Run(Convert convert, float* numbers, std::int32_t count) noexcept {
    constexpr std::int32_t kMostVector = DeepBlock::kPad;
    const std::int32_t rest = count % kMostVector, whole = count - rest;
    convert(numbers, whole);
    if (rest == 0) return;
    float last[kMostVector] = {};
    std::copy_n(numbers + whole, rest, last);
    convert(last, kMostVector);
    std::copy_n(last, rest, numbers + whole);
}

}  // namespace

void LightToDisplay(LightCurve curve, float* numbers, std::int32_t count, SimdLevel level) noexcept {
    Run(DeepKernelsOf(level).toDisplay[static_cast<std::size_t>(curve)], numbers, count);
}

void DisplayToLight(LightCurve curve, float* numbers, std::int32_t count, SimdLevel level) noexcept {
    Run(DeepKernelsOf(level).toLight[static_cast<std::size_t>(curve)], numbers, count);
}

}  // namespace velmora::render

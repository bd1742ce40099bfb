// Chooses how pixels are processed. The fastest level is used unless the environment asks for another one, for tests or
// to track down a fault. The output bytes are the same.
//
//   VELMORA_SIMD=plain, sse2, ssse3, avx2 or avx512   no faster SIMD level of the pixel kernels than this
#pragma once

#include <string_view>

#include "render/renderer.h"

namespace velmora {

inline constexpr const char* kSimdVariable = "VELMORA_SIMD";

// The level's name in the variable.
[[nodiscard]] std::string_view NameOf(render::SimdLevel level) noexcept;

// Reads the process's environment again. Values other than those above are ignored; a level that the processor lacks
// gives the best one that it has.
[[nodiscard]] render::RenderOptions ReadRenderOptions() noexcept;

}  // namespace velmora

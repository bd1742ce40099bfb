// How the pixels of a process are worked on: the best way, unless whoever runs it wants another one for tests or
// to look for a fault. The bytes are the same.
//
//   VELMORA_FORM=plain, sse2, ssse3, avx2 or avx512   no faster SIMD level of the pixel kernels than this
#pragma once

#include "render/renderer.h"

namespace velmora {

// Reads the process's environment anew. Other values than those above count as none; a level that the processor
// lacks gives the best one that it has.
[[nodiscard]] render::RenderOptions ReadRenderOptions() noexcept;

}  // namespace velmora

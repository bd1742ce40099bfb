// The deep kernels with SSE2.

#include "render/deep/deep_kernels.h"

#include <cstdint>

#include "render/glow_kernels.h"
#include "render/simd/target.h"

#if VM_HAS_SSE2
VM_BEGIN_TARGET("sse2")

namespace velmora::render {
namespace {

#include "render/simd/floats_sse2.h"

#include "render/deep/deep_kernels.inc"

}  // namespace

const DeepKernels kDeepSse2Kernels = kKernels;

}  // namespace velmora::render

VM_END_TARGET
#endif

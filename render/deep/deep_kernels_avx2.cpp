// The deep kernels with AVX2.

#include "render/deep/deep_kernels.h"

#include <cstdint>

#include "render/glow_kernels.h"
#include "render/simd/target.h"

#if VM_HAS_AVX2
VM_BEGIN_TARGET("avx2")

namespace velmora::render {
namespace {

#include "render/simd/floats_avx2.h"

#include "render/deep/deep_kernels.inc"

}  // namespace

const DeepKernels kDeepAvx2Kernels = kKernels;

}  // namespace velmora::render

VM_END_TARGET
#endif

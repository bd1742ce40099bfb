// The deep kernels without vectors of their own: the reference for the others.

#include "render/deep/deep_kernels.h"

#include "render/glow_kernels.h"
#include "render/simd/target.h"

namespace velmora::render {
namespace {

#include "render/simd/floats_plain.h"

#include "render/deep/deep_kernels.inc"

}  // namespace

const DeepKernels kDeepPlainKernels = kKernels;

const DeepKernels& DeepKernelsOf([[maybe_unused]] SimdLevel level) noexcept {
#if VM_HAS_AVX512
    if (level >= SimdLevel::kAvx512) return kDeepAvx512Kernels;
#endif
#if VM_HAS_AVX2
    if (level >= SimdLevel::kAvx2) return kDeepAvx2Kernels;
#endif
#if VM_HAS_SSE2
    if (level >= SimdLevel::kSse2) return kDeepSse2Kernels;
#endif
    return kDeepPlainKernels;
}

}  // namespace velmora::render

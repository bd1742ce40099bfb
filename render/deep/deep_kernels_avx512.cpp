// The deep kernels with AVX-512.

#include "render/deep/deep_kernels.h"

#include <cstdint>

#include "render/glow_kernels.h"
#include "render/simd/target.h"

#if VM_HAS_AVX512
VM_BEGIN_TARGET("avx512f,avx512bw,avx512vl,avx512vbmi")

namespace velmora::render {
namespace {

#include "render/simd/floats_avx512.h"

#include "render/deep/deep_kernels.inc"

}  // namespace

const DeepKernels kDeepAvx512Kernels = kKernels;

}  // namespace velmora::render

VM_END_TARGET
#endif

// The loops compiled with AVX-512.

#include "programs/reelfx/conversion/row_kernels.h"

#include <bit>
#include <type_traits>

#include "render/simd/target.h"

#if VM_HAS_AVX512
VM_BEGIN_TARGET("avx512f,avx512bw,avx512vl")

namespace velmora::hosts {
namespace {

#include "programs/reelfx/conversion/row_kernels.inc"

}  // namespace

const RowKernels kAvx512RowKernels = kKernels;

}  // namespace velmora::hosts

VM_END_TARGET
#endif

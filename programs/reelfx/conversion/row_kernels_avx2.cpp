// The loops compiled with AVX2.

#include "programs/reelfx/conversion/row_kernels.h"

#include <bit>
#include <type_traits>

#include "render/simd/target.h"

#if VM_HAS_AVX2
VM_BEGIN_TARGET("avx2")

namespace velmora::hosts {
namespace {

#include "programs/reelfx/conversion/row_kernels.inc"

}  // namespace

const RowKernels kAvx2RowKernels = kKernels;

}  // namespace velmora::hosts

VM_END_TARGET
#endif

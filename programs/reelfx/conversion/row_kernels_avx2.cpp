// The loops compiled with AVX2.

#include <bit>
#include <type_traits>

#include "programs/reelfx/conversion/row_kernels.h"
#include "render/simd/target.h"

#if VM_HAS_AVX2
#define VM_ROW_KERNELS kAvx2RowKernels
VM_BEGIN_TARGET("avx2")
#include "programs/reelfx/conversion/row_kernels.inc"
VM_END_TARGET
#endif

// The loops compiled with AVX-512.

#include <bit>
#include <type_traits>

#include "programs/reelfx/conversion/row_kernels.h"
#include "render/simd/target.h"

#if VM_HAS_AVX512
#define VM_ROW_KERNELS kAvx512RowKernels
VM_BEGIN_TARGET("avx512f,avx512bw,avx512vl")
#include "programs/reelfx/conversion/row_kernels.inc"
VM_END_TARGET
#endif

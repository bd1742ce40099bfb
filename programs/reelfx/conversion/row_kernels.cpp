// The loops compiled for every processor.

#include "programs/reelfx/conversion/row_kernels.h"

#include <bit>
#include <type_traits>

#include "render/simd/target.h"

#define VM_ROW_KERNELS kPlainRowKernels
#include "programs/reelfx/conversion/row_kernels.inc"

namespace velmora::hosts {

const RowKernels& RowKernelsOf([[maybe_unused]] render::SimdLevel level) noexcept {
#if VM_HAS_AVX512
    if (level >= render::SimdLevel::kAvx512) return kAvx512RowKernels;
#endif
#if VM_HAS_AVX2
    if (level >= render::SimdLevel::kAvx2) return kAvx2RowKernels;
#endif
    return kPlainRowKernels;
}

}  // namespace velmora::hosts

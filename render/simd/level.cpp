#include "render/simd/level.h"

#include "render/simd/target.h"

namespace velmora::render {

SimdLevel BestSimdLevel() noexcept {
#if VM_IS_X86
    // Checks the processor and whether the operating system saves the wide registers.
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
        __builtin_cpu_supports("avx512vl") && __builtin_cpu_supports("avx512vbmi")) {
        return SimdLevel::kAvx512;
    }
    if (__builtin_cpu_supports("avx2")) return SimdLevel::kAvx2;
    if (__builtin_cpu_supports("ssse3")) return SimdLevel::kSsse3;
    if (__builtin_cpu_supports("sse2")) return SimdLevel::kSse2;
    return SimdLevel::kPlain;
#else
    // The instructions that the compiler was set to use are present.
    return VM_HAS_SSSE3 ? SimdLevel::kSsse3 : VM_HAS_SSE2 ? SimdLevel::kSse2 : SimdLevel::kPlain;
#endif
}

}  // namespace velmora::render

#include "render/simd/level.h"

namespace velmora::render {

SimdLevel BestSimdLevel() noexcept {
#if defined(__i386__) || defined(__x86_64__)
    // Asks the processor and whether the operating system keeps the wide registers.
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
        __builtin_cpu_supports("avx512vl") && __builtin_cpu_supports("avx512vbmi")) {
        return SimdLevel::kAvx512;
    }
    if (__builtin_cpu_supports("avx2")) return SimdLevel::kAvx2;
    if (__builtin_cpu_supports("sse2")) return SimdLevel::kSse2;
#endif
    return SimdLevel::kPlain;
}

}  // namespace velmora::render

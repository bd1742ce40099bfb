#include "render/cpu.h"

namespace velmora::render {

Form BestForm() noexcept {
#if defined(__i386__) || defined(__x86_64__)
    // Asks the processor and whether the operating system keeps the wide registers.
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
        __builtin_cpu_supports("avx512vl") && __builtin_cpu_supports("avx512vbmi")) {
        return Form::kAvx512;
    }
    if (__builtin_cpu_supports("avx2")) return Form::kAvx2;
    if (__builtin_cpu_supports("sse2")) return Form::kSse2;
#endif
    return Form::kPlain;
}

}  // namespace velmora::render

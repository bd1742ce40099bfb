// The SIMD levels of the pixel kernels. The plain level is the reference; the others give the same bytes.
#pragma once

namespace velmora::render {

// A processor that supports a level also supports the levels before it.
enum class SimdLevel {
    kPlain,
    kSse2,
    kSsse3,
    kAvx2,
    kAvx512,  // with byte permutations (VBMI)
};
inline constexpr SimdLevel kSimdLevels[] = {SimdLevel::kPlain, SimdLevel::kSse2, SimdLevel::kSsse3,
                                            SimdLevel::kAvx2, SimdLevel::kAvx512};

// The fastest level that this build has and that this processor and operating system can run.
[[nodiscard]] SimdLevel BestSimdLevel() noexcept;

}  // namespace velmora::render

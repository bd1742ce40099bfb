// Between numbers in proportion to light and the display values that the stages work on, for pictures of hosts that work
// in linear light.
//
// Powers are computed by Newton's steps instead of a library's function, a dozen times faster and the same on every
// system and at every SIMD level. Within 0..1 they are within 1e-6 of the formulas and rise where those rise by as little
// as a quarter of a 65535th; above, they are within 1e-6 of the value.
#pragma once

#include <cstdint>

#include "render/simd/level.h"

namespace velmora::render {

enum class LightCurve : std::uint8_t {
    kSrgb,   // IEC 61966-2-1; straight below 0
    kGamma,  // a power of 2.4; below 0 as above, with the sign
};

// `count` numbers in place. One that is none becomes 0.
void LightToDisplay(LightCurve curve, float* numbers, std::int32_t count,
                    SimdLevel level = BestSimdLevel()) noexcept;
void DisplayToLight(LightCurve curve, float* numbers, std::int32_t count,
                    SimdLevel level = BestSimdLevel()) noexcept;

}  // namespace velmora::render

// Moves a pixel's colour toward white or black by a fraction: what wear and spots do.
#pragma once

#include <cstdint>

#include "render/image.h"
#include "render/rounding.h"

namespace velmora::render {

// One channel by `fraction` (-1..1): above 0 toward white, below 0 toward black, 0 leaves it. The product is
// single precision, rounded half away from zero; the result keeps its low 8 bits.
[[nodiscard]] inline std::uint8_t ShadeChannel(std::uint8_t channel, float fraction) noexcept {
    const double distance = fraction > 0.0f ? 255 - channel : channel;
    return static_cast<std::uint8_t>(channel + RoundHalfAway(Narrow(fraction * distance)));
}

// Alpha is kept.
[[nodiscard]] inline Bgra ShadePixel(Bgra pixel, float fraction) noexcept {
    return {ShadeChannel(pixel.blue, fraction), ShadeChannel(pixel.green, fraction),
            ShadeChannel(pixel.red, fraction), pixel.alpha};
}

}  // namespace velmora::render

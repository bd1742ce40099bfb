// The frei0r colour model that costs hosts least is red, green, blue, alpha; the effects use blue, green,
// red, alpha.
#pragma once

#include <cstddef>
#include <cstdint>

namespace velmora::hosts::frei0r {

// Swaps bytes 0 and 2 of each pixel. `in` and `out` may be the same. Written so that the compiler vectorises
// it.
inline void SwapRedAndBlue(const std::uint32_t* in, std::uint32_t* out, std::size_t count) noexcept {
    for (std::size_t i = 0; i < count; ++i) {
        const std::uint32_t pixel = in[i];
        out[i] = (pixel & 0xFF00FF00u) | ((pixel & 0xFFu) << 16) | ((pixel >> 16) & 0xFFu);
    }
}

}  // namespace velmora::hosts::frei0r

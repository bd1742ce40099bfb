// The colours of a knob, as 0x00RRGGBB.
#pragma once

#include <cstdint>

namespace velmora::reelview {

struct KnobColours {
    std::uint32_t background = 0xF0F0F0, track = 0xC8C8C8, value = 0xB07830, body = 0xFAFAFA, rim = 0x909090,
                  pointer = 0x303030, focus = 0x0060C0;
};

}  // namespace velmora::reelview

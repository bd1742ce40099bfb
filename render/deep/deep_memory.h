// What deep rendering keeps from frame to frame, so that frames of one size allocate once.
#pragma once

#include <cstdint>

#include "render/growing_memory.h"

namespace velmora::render {

using DeepGlowMemory = GrowingMemory<float>;

struct DeepMemory {
    DeepGlowMemory glow;
    GrowingMemory<std::uint8_t> copy;  // of the source, for frames rendered in place
};

}  // namespace velmora::render

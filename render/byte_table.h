// A lookup table for one channel.
#pragma once

#include <array>
#include <cstdint>

namespace velmora::render {

using ByteTable = std::array<std::uint8_t, 256>;

}  // namespace velmora::render

#pragma once

// A hash of one word, for looks that must be the same on every build and in any order of work.

#include <cstdint>

namespace velmora::render {

// Every bit of the argument moves about half of the result's bits.
constexpr std::uint32_t MixBits(std::uint32_t word) noexcept {
    word = (word ^ (word >> 15)) * 0x9E3779B1u;
    word = (word ^ (word >> 13)) * 0x85A308D3u;
    return word ^ (word >> 16);
}

}  // namespace velmora::render

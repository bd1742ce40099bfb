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

// The seed of a sequence whose own seed follows from the settings alone, in a host that gives a seed: without one
// (0) it stays, and any two others give two different values.
constexpr std::uint32_t SeedFor(std::uint32_t own, std::uint32_t hostSeed) noexcept {
    return hostSeed == 0 ? own : MixBits(own ^ MixBits(hostSeed));
}

}  // namespace velmora::render

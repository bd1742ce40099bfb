#pragma once

// A hash of one word, for looks that must not depend on the build or on the order of work.

#include <cstdint>

namespace velmora::render {

// Every bit of the argument affects about half of the result's bits.
constexpr std::uint32_t MixBits(std::uint32_t word) noexcept {
    word = (word ^ (word >> 15)) * 0x9E3779B1u;
    word = (word ^ (word >> 13)) * 0x85A308D3u;
    return word ^ (word >> 16);
}

// Combines a sequence's seed, which depends on the settings only, with the host's seed. A host seed of 0 means none
// and leaves the seed as it is. Any two other host seeds give different results.
constexpr std::uint32_t SeedFor(std::uint32_t own, std::uint32_t hostSeed) noexcept {
    return hostSeed == 0 ? own : MixBits(own ^ MixBits(hostSeed));
}

}  // namespace velmora::render

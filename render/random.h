// The renderer's random numbers: a linear congruential generator whose state is one 32-bit word owned by the caller.
// Draws use integer arithmetic only, so a state gives the same numbers on every build.
#pragma once

#include <algorithm>
#include <cstdint>

#include "render/rounding.h"

namespace velmora::render {

class Random {
  public:
    constexpr Random() noexcept = default;
    constexpr explicit Random(std::uint32_t state) noexcept : m_state(state) {}

    [[nodiscard]] constexpr std::uint32_t State() const noexcept { return m_state; }

    // Advances once and returns 0..32767.
    constexpr std::uint32_t Next() noexcept {
        m_state = m_state * kMultiplier + kIncrement;
        return (m_state >> 16) & 0x7FFFu;
    }

    // A draw between two integers in either order, ends included. The upper end comes up once in 32768 draws, since
    // the division truncates. The span must not exceed 131073 (the product is 32 bits wide).
    constexpr std::int32_t Draw(std::int32_t a, std::int32_t b) noexcept {
        const std::uint32_t low = static_cast<std::uint32_t>(a < b ? a : b);
        const std::uint32_t high = static_cast<std::uint32_t>(a < b ? b : a);
        return static_cast<std::int32_t>(Next() * (high - low) / 32767u + low);
    }

    // A draw between `low` and `high` with `decimals` digits after the point, clamped to the two.
    double DrawDecimal(float low, float high, int decimals) noexcept {
        double scale = 1.0;
        for (int i = 0; i < decimals; ++i) scale *= 10.0;
        const std::int32_t drawn =
            Draw(RoundHalfAway(Narrow(low * scale)), RoundHalfAway(Narrow(high * scale)));
        return std::clamp(drawn / scale, double{std::min(low, high)}, double{std::max(low, high)});
    }

    // Advances as `count` draws would, in at most 32 rounds.
    constexpr void Skip(std::uint32_t count) noexcept {
        std::uint32_t multiplier = kMultiplier, increment = kIncrement;
        for (; count != 0; count >>= 1) {
            if (count & 1u) m_state = m_state * multiplier + increment;
            increment *= multiplier + 1u;
            multiplier *= multiplier;
        }
    }

  private:
    static constexpr std::uint32_t kMultiplier = 1103515245u;
    static constexpr std::uint32_t kIncrement = 12345u;

    std::uint32_t m_state = 0;
};

// A hash of one word, for looks that must not depend on the build or on the order of work. Every bit of the argument
// affects about half of the result's bits.
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

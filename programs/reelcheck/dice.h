// Random numbers that can be repeated from a printed seed, the same on every system.
#pragma once

#include <cstdint>
#include <string_view>

namespace velmora::reelcheck {

class Dice {
  public:
    // Each name has its own sequence, so a check draws the same numbers whether it runs alone or after others.
    Dice(std::uint64_t seed, std::string_view name) noexcept : m_state(seed) {
        for (const char letter : name)
            m_state = (m_state ^ static_cast<unsigned char>(letter)) * 0x100000001B3u;
    }

    // Any 64 bits (SplitMix).
    std::uint64_t Bits() noexcept {
        std::uint64_t x = m_state += 0x9E3779B97F4A7C15u;
        x = (x ^ x >> 30) * 0xBF58476D1CE4E5B9u;
        x = (x ^ x >> 27) * 0x94D049BB133111EBu;
        return x ^ x >> 31;
    }
    std::uint32_t Word() noexcept { return static_cast<std::uint32_t>(Bits() >> 32); }
    // From `lowest` to `highest` inclusive.
    std::int32_t Between(std::int32_t lowest, std::int32_t highest) noexcept {
        const auto count = static_cast<std::uint64_t>(std::int64_t{highest} - lowest + 1);
        return static_cast<std::int32_t>(lowest + static_cast<std::int64_t>(Bits() % count));
    }
    float Unit() noexcept { return static_cast<float>(Word() >> 8) / 16777215.0f; }
    bool OneIn(std::int32_t count) noexcept { return Between(1, count) == 1; }

  private:
    std::uint64_t m_state;
};

}  // namespace velmora::reelcheck

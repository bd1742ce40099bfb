// One check of the library, and what it works with: how it fails, and its random numbers.
#pragma once

#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>

namespace velmora::reelcheck {

#if defined(__MINGW32__)
#define REELCHECK_PRINTF(text, first) __attribute__((format(__MINGW_PRINTF_FORMAT, text, first)))
#else
#define REELCHECK_PRINTF(text, first) __attribute__((format(printf, text, first)))
#endif

// Formatted text.
[[nodiscard]] std::string Text(const char* format, ...) REELCHECK_PRINTF(1, 2);

inline constexpr int kLowestLevel = 1;
inline constexpr int kHighestLevel = 10;
inline constexpr int kUsualLevel = 5;

// The library breaks its contract. The text says where and how.
class CheckFailed : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Where a check is, for the report of a crash or a hang. Cheap enough to set for every frame.
void SetPlace(const char* format, ...) REELCHECK_PRINTF(1, 2);
[[nodiscard]] const char* Place() noexcept;
// Fails with the place prefixed to the text.
[[noreturn]] void Fail(const std::string& text);

inline void Require(bool holds, const char* text) {
    if (!holds) Fail(text);
}

// Random numbers that can be repeated from a printed seed, the same on every system.
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

struct CheckContext {
    std::string libraryPath;  // empty: the default
    std::string bundlePath;   // of the OpenFX bundle; empty: the default
    int level = kUsualLevel;
    Dice dice;

    // How many times to try something: `few` up to the default level, `many` at the highest, a geometric scale in
    // between.
    [[nodiscard]] int Rounds(int few, int many) const;
};

struct Check {
    const char* name;
    int level;  // the lowest level that runs it
    void (*run)(CheckContext& context);
    const char* what;
};

// In the order in which they run: those of the library, then those of the OpenFX bundle, each by level. On Windows the
// 32-bit program has the first, the 64-bit one the second, because a process can load only modules of its own kind.
[[nodiscard]] std::span<const Check> AllChecks();

}  // namespace velmora::reelcheck

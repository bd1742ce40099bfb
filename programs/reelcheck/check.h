// One check of the library, and its context.
#pragma once

#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>

#include "programs/reelcheck/dice.h"

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

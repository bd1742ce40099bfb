// The command line.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {

struct Options {
    int level = kUsualLevel;
    std::uint64_t seed = 0;    // drawn from the clock when none is given
    int timeoutSeconds = 900;  // for one check
    std::vector<std::string> only;
    std::string library;
    bool help = false;
    bool list = false;
    bool json = false;
    std::optional<int> childFrom;  // set in a child: the position of its first check
};

extern const char* const kHelp;

// Throws std::invalid_argument with a text for the user.
[[nodiscard]] Options ReadOptions(int count, char** arguments);
// The command line that makes a child of this run begin with the check at `position`.
[[nodiscard]] std::vector<std::string> ChildArguments(const Options& options, int position);

// What this run does, in its order: the checks that are named, else those of its level and below. Throws
// std::invalid_argument for a name that there is not.
[[nodiscard]] std::vector<const Check*> ChosenChecks(const Options& options);

}  // namespace velmora::reelcheck

// The command line, and the run that it asks for: the checks run in child processes; the parent follows them and prints
// what they report.
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
    std::string bundle;
    bool help = false;
    bool list = false;
    bool json = false;
    std::optional<int> childFrom;  // set in a child: the index of its first check
};

extern const char* const kHelp;

// Throws std::invalid_argument with a text for the user.
[[nodiscard]] Options ReadOptions(int count, char** arguments);
// The command line for a child of this run that begins with the check at `position`.
[[nodiscard]] std::vector<std::string> ChildArguments(const Options& options, int position);

// The checks of this run, in order: those named, else those of its level and below. Throws std::invalid_argument for
// an unknown name.
[[nodiscard]] std::vector<const Check*> ChosenChecks(const Options& options);

// Prints one line per check and a final one; or everything as JSON. True when every check passed.
[[nodiscard]] bool RunChecks(const Options& options);

// The child's part: runs checks and reports each one on standard output.
//
// Runs the selected checks from options.childFrom on. Lines, one per event:
//
//   begin
//   ok SECONDS
//   failed SECONDS TEXT
//   crash TEXT             and the process ends
int RunChild(const Options& options);

}  // namespace velmora::reelcheck

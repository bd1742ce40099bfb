// The checks are run in children; the first process follows them and prints what they report.
#pragma once

#include "programs/reelcheck/options.h"

namespace velmora::reelcheck {

// One line a check, then one for all; or all as JSON. True when every check passed.
[[nodiscard]] bool RunChecks(const Options& options);

// The child's part: runs checks and tells of each on standard output.
//
// Runs the chosen checks from options.childFrom on. Lines, one for each event:
//
//   begin
//   ok SECONDS
//   failed SECONDS TEXT
//   crash TEXT             and the process ends
int RunChild(const Options& options);

}  // namespace velmora::reelcheck

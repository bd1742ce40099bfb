// The checks run in child processes; the parent follows them and prints what they report.
#pragma once

#include "programs/reelcheck/options.h"

namespace velmora::reelcheck {

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

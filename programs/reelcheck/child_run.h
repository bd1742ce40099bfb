// The child's part: runs checks and tells of each on standard output.
#pragma once

#include "programs/reelcheck/options.h"

namespace velmora::reelcheck {

// Runs the chosen checks from options.childFrom on. Lines, one for each event:
//
//   begin
//   ok SECONDS
//   failed SECONDS TEXT
//   crash TEXT             and the process ends
int RunChild(const Options& options);

}  // namespace velmora::reelcheck

// The first process's part: has the checks run in children and prints what they tell.
#pragma once

#include "programs/reelcheck/options.h"

namespace velmora::reelcheck {

// One line a check, then one for all; or all as JSON. True when every check passed.
[[nodiscard]] bool RunChecks(const Options& options);

}  // namespace velmora::reelcheck

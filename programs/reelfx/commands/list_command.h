// `reelfx list`: the effects with their parameters and presets.
#pragma once

#include <optional>
#include <string>

#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {

struct ListOptions {
    std::optional<std::string> effect;  // only this one
    bool asJson = false;
};

// Throws UsageError when there is no such effect.
ExitCode Run(const ListOptions& options);

}  // namespace velmora::hosts

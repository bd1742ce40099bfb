// `reelfx presets`: the built-in presets of an effect with their settings.
#pragma once

#include <string>

#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {

struct PresetsOptions {
    std::string effect;
    bool asJson = false;
};

// Throws UsageError when there is no such effect.
ExitCode Run(const PresetsOptions& options);

}  // namespace velmora::hosts

// `reelfx preset show` and `reelfx preset save`: preset files, which editors can also read and write.
#pragma once

#include <string>

#include "programs/reelfx/common/effect_choice.h"
#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {

struct PresetShowOptions {
    std::string file;
    bool asJson = false;
};

struct PresetSaveOptions {
    std::string file;
    std::string name;  // empty: the file name without its extension
    EffectOptions effect;
    bool mayOverwrite = false;
};

// Throw Failure or UsageError.
ExitCode Run(const PresetShowOptions& options);
ExitCode Run(const PresetSaveOptions& options);

}  // namespace velmora::hosts

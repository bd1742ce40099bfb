// `reelfx render IN... --into DIR`: many clips with the same options, each to a file of its own.
#pragma once

#include <string>
#include <vector>

#include "programs/reelfx/commands/render_command.h"
#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {

struct BatchOptions {
    RenderOptions render;  // for each clip; it has an output, whose path is not used
    std::vector<std::string> inputs;
    std::string folder;  // created if needed
};

// The file that a clip is written to: the clip's own name in the folder, with the extension of the container if one is
// chosen.
std::string BatchOutput(const BatchOptions& options, const std::string& input);

// A clip that fails is reported, and the next one is rendered. Returns the code of the first that failed. Throws
// UsageError before anything is rendered if two clips would have the same output, or an output is one of the clips.
ExitCode Run(const BatchOptions& options);

}  // namespace velmora::hosts

// `reelfx info`: describes a clip and how it would be rendered.
#pragma once

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/media_reader.h"

namespace velmora::hosts {

struct InfoOptions {
    InputOptions input;
    bool asJson = false;
};

// Throws Failure.
ExitCode Run(const InfoOptions& options);

}  // namespace velmora::hosts

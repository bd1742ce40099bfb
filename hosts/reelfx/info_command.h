// `reelfx info`: what a clip is, and what rendering would do with it.
#pragma once

#include "hosts/reelfx/failure.h"
#include "hosts/reelfx/media_reader.h"

namespace velmora::hosts {

struct InfoOptions {
    InputOptions input;
    bool asJson = false;
};

// Throws Failure.
ExitCode RunInfo(const InfoOptions& options);

}  // namespace velmora::hosts

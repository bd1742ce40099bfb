// The command line of reelhost.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "text/number_text.h"
#include "programs/common/y4m.h"

namespace velmora::hosts {

enum class HostMode { kRender, kList, kAllPresets, kBench, kSoak, kHelp };

struct HostOptions {
    HostMode mode = HostMode::kRender;
    std::string dll;     // empty: next to the program
    std::string effect;  // may be "all" for kAllPresets
    std::optional<std::string> preset;
    std::vector<std::string> settings;
    std::optional<FrameSize> size;  // raw BGRA
    std::optional<FrameRate> rate;
    std::optional<Y4mMatrix> matrix;  // of YUV4MPEG2
    std::optional<std::int64_t> frameLimit;
    bool withDigests = false;
};

// Throws UsageError.
HostOptions ReadHostOptions(int count, char** arguments);

extern const char* const kHostHelp;

}  // namespace velmora::hosts

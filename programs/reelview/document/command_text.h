// The reelfx command line that renders what the window shows.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "programs/common/effect_info.h"
#include "text/number_text.h"
#include "programs/reelview/document/settings_history.h"

namespace velmora::reelview {

struct CommandInput {
    std::string path;  // in UTF-8; for numbered pictures, their pattern (source/sequence_names.h)
    // For numbered pictures only:
    std::optional<hosts::FrameRate> rate;
    std::uint64_t firstNumber = 0;
    std::int64_t count = 0;  // 0: up to the last one that there is
};

// Values equal to the parameter's default are left out. Where two parameters
// share a name, the kind of the value shows which one is meant, so each can be written.
[[nodiscard]] std::string CommandText(const CommandInput& input, const hosts::EffectInfo& effect,
                                      const Values& values);

}  // namespace velmora::reelview

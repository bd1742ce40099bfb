// The command line of reelfx that renders what the window shows.
#pragma once

#include <string>

#include "programs/common/effect_info.h"
#include "programs/reelview/document/settings_history.h"

namespace velmora::reelview {

// `input` is the clip's path in UTF-8. Values that equal the parameter's default are left out. Where two parameters
// share a name, a value's kind tells which is meant, so each can be written.
[[nodiscard]] std::string CommandText(const std::string& input, const hosts::EffectInfo& effect,
                                      const Values& values);

}  // namespace velmora::reelview

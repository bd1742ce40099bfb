// The reelfx command line that renders what the window shows.
#pragma once

#include <string>

#include "programs/common/effect_info.h"
#include "programs/reelview/document/settings_history.h"

namespace velmora::reelview {

// `input` is the clip's path in UTF-8. Values equal to the parameter's default are left out. Where two parameters
// share a name, the kind of the value shows which one is meant, so each can be written.
[[nodiscard]] std::string CommandText(const std::string& input, const hosts::EffectInfo& effect,
                                      const Values& values);

}  // namespace velmora::reelview

// Values as the panel shows them and as a user types them.
#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "programs/common/effect_info.h"
#include "api/host_api.h"

namespace velmora::reelview {

// As many decimals as a thousandth of the range needs, without zeros at the end: "24.5", "-100", "0.25".
[[nodiscard]] std::string SliderText(const hosts::ParamInfo& param, double value, char decimalPoint);

// A point or a comma, whatever the locale; a number out of range is brought to the nearer end. Nothing when it is not
// a number.
[[nodiscard]] std::optional<double> TypedSlider(const hosts::ParamInfo& param, std::string_view text);

// "#RRGGBB" of a word 0x00BBGGRR.
[[nodiscard]] std::string ColourText(std::uint32_t colour);
[[nodiscard]] std::optional<std::uint32_t> TypedColour(std::string_view text);

}  // namespace velmora::reelview

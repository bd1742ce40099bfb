// Values as the panel shows them and as a user types them.
#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "programs/common/effect_info.h"
#include "api/host_api.h"

namespace velmora::reelview {

// As many decimals as a thousandth of the range needs, without trailing zeros: "24.5", "-100", "0.25".
[[nodiscard]] std::string SliderText(const hosts::ParamInfo& param, double value, char decimalPoint);

// Accepts a decimal point or comma, whatever the locale, and clamps to the range. Empty when the text is not a
// number.
[[nodiscard]] std::optional<double> TypedSlider(const hosts::ParamInfo& param, std::string_view text);

// "#RRGGBB" for a word 0x00BBGGRR.
[[nodiscard]] std::string ColourText(std::uint32_t colour);
[[nodiscard]] std::optional<std::uint32_t> TypedColour(std::string_view text);

}  // namespace velmora::reelview

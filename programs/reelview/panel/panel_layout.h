// The position of each control on an effect's panel, computed from the effect's descriptors alone.
//
// Descriptors place controls in dialog units and often give no size. A round knob with its caption and number then
// takes a box of 48 x 80 units; in the library's own panels, columns and rows of such boxes are 66 and 90 units
// apart. A size of 198 x 30 means a horizontal bar. Sliders are drawn as bars if all the sliders of the panel have
// space for one, and as knobs if bars would overlap.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "programs/common/effect_info.h"
#include "programs/reelview/base/picture.h"
#include "api/host_api.h"

namespace velmora::reelview {

enum class PanelShape { kFrame, kKnob, kBar, kMenu, kColour, kCheckBox };

struct PanelItem {
    PanelShape shape = PanelShape::kFrame;
    std::uint32_t parameter = 0;  // for a frame: that of the end marker
    std::string title;
    std::string group;  // title of the enclosing frame; empty outside frames
    Box caption;        // for a frame: that of its title
    Box control;        // for a frame: the frame itself
    Box field;          // the number or the colour's text; empty where there is none
};

struct PanelLayout {
    std::vector<PanelItem> items;  // in the effect's order
    std::int32_t width = 0, height = 0;
};

// In pixels. Positions and sizes from a careless library are clamped to a range that a window can show.
[[nodiscard]] PanelLayout LayOutPanel(const std::vector<hosts::ParamInfo>& params, UnitScale scale);

// Values as the panel shows them and as a user types them: as many decimals as a thousandth of the range needs, without
// trailing zeros: "24.5", "-100", "0.25".
[[nodiscard]] std::string SliderText(const hosts::ParamInfo& param, double value, char decimalPoint);

// Accepts a decimal point or comma, whatever the locale, and clamps to the range. Empty when the text is not a
// number.
[[nodiscard]] std::optional<double> TypedSlider(const hosts::ParamInfo& param, std::string_view text);

// "#RRGGBB" for a word 0x00BBGGRR.
[[nodiscard]] std::string ColourText(std::uint32_t colour);
[[nodiscard]] std::optional<std::uint32_t> TypedColour(std::string_view text);

}  // namespace velmora::reelview

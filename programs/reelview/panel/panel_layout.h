// Where each control of an effect's panel stands, from the effect's descriptors alone.
//
// Descriptors place controls in dialog units and often give no size. A round knob with its caption and number takes a
// box of 48 x 80 units then; rows and columns of such boxes are 66 and 90 units apart in the library's own panels. A
// size of 198 x 30 is that of a lying bar: sliders are drawn as bars where all the panel's sliders have room for it, and
// as knobs where bars would lie on one another.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "programs/common/effect_info.h"
#include "programs/reelview/base/box.h"

namespace velmora::reelview {

enum class PanelShape { kFrame, kKnob, kBar, kMenu, kColour, kCheckBox };

struct PanelItem {
    PanelShape shape = PanelShape::kFrame;
    std::uint32_t parameter = 0;  // frame: of the end marker
    std::string title;
    std::string group;  // of the frame that holds it; empty outside of frames
    Box caption;        // frame: of its title
    Box control;        // frame: the frame itself
    Box field;          // the number or the colour's text; empty where there is none
};

struct PanelLayout {
    std::vector<PanelItem> items;  // in the effect's order
    std::int32_t width = 0, height = 0;
};

// In pixels. Places and sizes that a careless library gives are brought into a range that a window can show.
[[nodiscard]] PanelLayout LayOutPanel(const std::vector<hosts::ParamInfo>& params, UnitScale scale);

}  // namespace velmora::reelview

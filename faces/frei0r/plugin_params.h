// The parameters of a frei0r plug-in, taken from the effect's table. Hosts address parameters by index
// (FFmpeg's "a|b|c", MLT's "0=...") and by name, so the order is part of the contract: append only.
//
//   index  name           type    value
//   0      preset         string  a preset's name, the path of a preset file (with a slash), or empty for none
//   1      seed           string  0..4294967295; another seed gives other shake, flicker and damage
//   2      start frame    string  the clip's frame that the host's time 0 shows
//   3      frame rate     string  "25", "30000/1001"; see frame_clock.h
//   4...   the effect's   double  slider, 0..1 over its shown range
//                         bool    check box
//                         colour  colour
//                         string  menu: an item's text or its number from 0
//
// The first four come first because FFmpeg can omit parameters only at the end.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "effects/effect_queries.h"
#include "effects/effect_table.h"

namespace velmora::hosts::frei0r {

enum class ParamRole : std::uint8_t { kPreset, kSeed, kStartFrame, kFrameRate, kOwn };

struct PluginParam {
    // Unique even in lower case with hyphens for spaces, because hosts turn names into property names that
    // way.
    std::string name;
    int type;  // F0R_PARAM_...
    std::string explanation;
    ParamRole role;
    std::uint32_t own = 0;  // the effect's parameter, if the role is kOwn
};

struct PluginDescription {
    const effects::EffectTable& effect;
    std::string name;         // "Velmora Film Camera"
    std::string fileName;     // "velmora_film_camera", without the extension
    std::string explanation;  // one sentence
    std::vector<PluginParam> params;
};

PluginDescription DescribePlugin(const effects::EffectTable& effect);

// The menu item with that text, or with that number counted from 0.
[[nodiscard]] std::optional<std::uint32_t> FindItemOrNumber(const effects::ParamRow& menu,
                                                            std::string_view text);

}  // namespace velmora::hosts::frei0r

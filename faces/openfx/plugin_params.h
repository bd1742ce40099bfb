// The parameters of an OpenFX plug-in, taken from the effect's table. Hosts' projects refer to plug-ins by identifier
// and to parameters by name, so both are part of the contract.
//
//   name            type          value
//   preset          choice        "None" and the built-in presets; choosing one sets the effect's own parameters
//   the effect's    Double        slider, in its shown range
//                   RGB           colour
//                   Boolean       check box
//                   Choice        menu
//   mix             Double        0..100, how much of the result is mixed into the source
//   seed            Integer       another seed gives other shake, flicker and damage
//   newSeed         push button   draws a seed
//   startFrame      Integer       the clip's frame that the host's time 0 shows
//   workingSpace    Choice        what the pixels' values mean: see WorkingSpace
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "effects/effect_table.h"

namespace velmora::hosts::openfx {

enum class ParamRole : std::uint8_t {
    kGroup,
    kOwn,
    kPreset,
    kMix,
    kSeed,
    kNewSeed,
    kStartFrame,
    kWorkingSpace
};

// In the order of the menu's items.
enum class WorkingSpace : std::uint8_t {
    kDisplay,     // as shown on a screen, which is what the effects are made for
    kLinearSrgb,  // proportional to light; converted to display values and back by sRGB's curve
    kLinear24,    // the same by a power of 2.4
    kNone,        // taken as it is: no conversion, and colours are not divided by alpha
};

struct PluginParam {
    std::string name;
    std::string label;
    std::string hint;
    std::string parent;  // the name of its group, or empty
    const char* type;    // kOfxParamType...
    ParamRole role;
    std::uint32_t own = 0;  // the effect's parameter, if the role is kOwn
    double minimum = 0.0;   // of Double and Integer
    double maximum = 0.0;
    double standard = 0.0;             // the default, also of Boolean and Choice
    std::vector<std::string> choices;  // of Choice
};

// Groups stand before their members.
[[nodiscard]] std::vector<PluginParam> DescribeParams(const effects::EffectTable& effect);

// What the effect's parameter of that title does: one or two sentences, the same as on the help page. This and the next
// are in a file that write_texts.py makes from the help pages and the language file.
[[nodiscard]] std::string HintOf(std::string_view effect, std::string_view title);

// The label of a parameter, group or menu item in a language (two letters); in English where there is none.
[[nodiscard]] std::string LabelOf(std::string_view language, std::string_view english);

// A slider's value between the table's stored format and the shown one. Stored values survive the way there and back.
[[nodiscard]] double ShownSlider(const effects::ParamRow& slider, ValueWord stored);
[[nodiscard]] ValueWord StoredSlider(const effects::ParamRow& slider, double shown);

// Whether frames differ although nothing is animated and the source stands still.
[[nodiscard]] bool IsFrameVarying(const effects::EffectTable& effect);

}  // namespace velmora::hosts::openfx

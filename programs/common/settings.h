// Settings as a user writes them, "NAME=VALUE", against an effect's parameters:
//
//   slider     a number of the shown range            "X Jitter=4", "Tint=-20.5"
//   colour     #RRGGBB                                 "Border=#102030"
//   menu       an item's text or its number from 0     "Pattern=Grainy", "Pattern=2"
//   check box  on, off, yes, no, true, false, 1, 0     "Thick=on"
//
// If two parameters have the same name (a colour and a slider), the kind of the value decides.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "programs/common/effect_info.h"
#include "api/host_api.h"

namespace velmora::hosts {

struct Setting {
    std::uint32_t parameter;
    ValueWord value;  // stored form: normalised number, colour word, item index or flag
};

// What a slider shows at its ends.
struct SliderRange {
    float minimum = 0.0f, maximum = 0.0f;
};
// The stored number, 0..1, of a shown one.
float NormalisedSlider(const SliderRange& range, double shown);

// Throws UsageError if there is no such parameter (and lists those that exist), or if the value is out of
// range or of another kind.
Setting ParseSetting(const EffectInfo& effect, std::string_view text);

// A stored value as a user would write it.
std::string ShownValue(const ParamInfo& param, ValueWord value);

}  // namespace velmora::hosts

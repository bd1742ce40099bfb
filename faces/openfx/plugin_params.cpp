#include "faces/openfx/plugin_params.h"

#include <cmath>
#include <limits>
#include <string_view>

#include "effects/effect_queries.h"
#include "faces/openfx/ofx_api.h"
#include "text/names.h"

namespace velmora::hosts::openfx {
namespace {

constexpr double kLargestInt = std::numeric_limits<int>::max();

// "Blue Channel Only" becomes "blueChannelOnly".
std::string NameOf(std::string_view title) {
    std::string name;
    bool startsWord = false;
    for (const char c : title) {
        if (c == ' ') {
            startsWord = true;
            continue;
        }
        name += startsWord ? c : ToLower(c);
        startsWord = false;
    }
    return name;
}

PluginParam Own(const effects::EffectTable& effect, std::uint32_t index) {
    const effects::ParamRow& row = effect.params[index];
    const std::string title = effects::UniqueName(effect, row);
    PluginParam param = {.name = NameOf(title),
                         .label = title,
                         .hint = HintOf(effect.name, title),
                         .parent = {},
                         .type = kOfxParamTypeBoolean,
                         .role = ParamRole::kOwn,
                         .own = index,
                         .choices = {}};
    switch (row.kind) {
        case kKindSlider:
            param.type = kOfxParamTypeDouble;
            param.minimum = double{row.minimum};
            param.maximum = double{row.maximum};
            param.standard = ShownSlider(row, row.defaultValue);
            break;
        case kKindColour:
            param.type = kOfxParamTypeRGB;
            break;
        case kKindMenu:
            param.type = kOfxParamTypeChoice;
            param.standard = row.defaultValue.item;
            param.choices.assign(row.items.begin(), row.items.end());
            break;
        default:
            param.standard = row.defaultValue.flag;
            break;
    }
    return param;
}

PluginParam Group(const char* title) {
    return {.name = NameOf(title) + "Group",
            .label = title,
            .hint = {},
            .parent = {},
            .type = kOfxParamTypeGroup,
            .role = ParamRole::kGroup,
            .choices = {}};
}

PluginParam Preset(const effects::EffectTable& effect) {
    PluginParam preset = {.name = "preset",
                          .label = "Preset",
                          .hint = "Sets the parameters below to those of a built-in preset.",
                          .parent = {},
                          .type = kOfxParamTypeChoice,
                          .role = ParamRole::kPreset,
                          .choices = {"None"}};
    preset.choices.insert(preset.choices.end(), effect.presetNames.begin(), effect.presetNames.end());
    return preset;
}

void AddCommon(std::vector<PluginParam>& params) {
    params.push_back({.name = "mix",
                      .label = "Mix",
                      .hint = "How much of the effect is mixed into the picture, in percent.",
                      .parent = {},
                      .type = kOfxParamTypeDouble,
                      .role = ParamRole::kMix,
                      .maximum = 100.0,
                      .standard = 100.0,
                      .choices = {}});
    params.push_back(
        {.name = "seed",
         .label = "Seed",
         .hint = "Another seed gives other shake, flicker and damage. With 0, flicker and scratches are "
                 "those of the Windows library.",
         .parent = {},
         .type = kOfxParamTypeInteger,
         .role = ParamRole::kSeed,
         .maximum = kLargestInt,
         .choices = {}});
    params.push_back({.name = "newSeed",
                      .label = "New seed",
                      .hint = "Draws another seed.",
                      .parent = {},
                      .type = kOfxParamTypePushButton,
                      .role = ParamRole::kNewSeed,
                      .choices = {}});
    params.push_back(
        {.name = "startFrame",
         .label = "Start frame",
         .hint = "The number of the clip's frame that time 0 shows. It is added to the time of a frame.",
         .parent = {},
         .type = kOfxParamTypeInteger,
         .role = ParamRole::kStartFrame,
         .minimum = -kLargestInt,
         .maximum = kLargestInt,
         .choices = {}});
    params.push_back(
        {.name = "workingSpace",
         .label = "Working space",
         .hint = "What the picture's values mean. Display: as shown on a screen. Linear: proportional to "
                 "light, converted to display and back by sRGB's curve or a power of 2.4. None: taken as "
                 "they are, also premultiplied ones.",
         .parent = {},
         .type = kOfxParamTypeChoice,
         .role = ParamRole::kWorkingSpace,
         .choices = {"Display", "Linear (sRGB curve)", "Linear (gamma 2.4)", "None"}});
}

}  // namespace

std::vector<PluginParam> DescribeParams(const effects::EffectTable& effect) {
    std::vector<PluginParam> params = {Preset(effect)};
    std::string parent;
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        const effects::ParamRow& row = effect.params[i];
        if (row.kind == kKindGroup) {
            parent.clear();
            if (row.isGroupEnd) continue;
            params.push_back(Group(row.name));
            parent = params.back().name;
        } else if (effects::HoldsValue(row)) {
            params.push_back(Own(effect, i));
            params.back().parent = parent;
        }
    }
    AddCommon(params);
    return params;
}

double ShownSlider(const effects::ParamRow& slider, ValueWord stored) {
    const double range = double{slider.maximum} - slider.minimum;
    const double exact = slider.minimum + stored.number * range;
    // The table's values have few decimals; the format's precision must not show.
    const double rounded = std::round(exact * 1e4) / 1e4;
    return StoredSlider(slider, rounded).bits == stored.bits ? rounded : exact;
}

ValueWord StoredSlider(const effects::ParamRow& slider, double shown) {
    const double range = double{slider.maximum} - slider.minimum;
    return {.number = static_cast<float>((shown - slider.minimum) / range)};
}

bool IsFrameVarying(const effects::EffectTable& effect) {
    std::uint32_t index = 0;
    for (const MasterRow& row : kMasterRows) {
        if (!row.IsSetting()) continue;
        const bool isOwn = effect.answers[index++].source == effects::MasterAnswer::Source::kOwn;
        switch (row.Setting()) {
            case Master::kYJitter:
            case Master::kXJitter:
            case Master::kFlicker:
            case Master::kWear:
            case Master::kSpots:
            case Master::kScratches:
                if (isOwn) return true;
                break;
            default:
                break;
        }
    }
    return false;
}

}  // namespace velmora::hosts::openfx

#include "faces/frei0r/plugin_params.h"

#include <frei0r.h>

#include <algorithm>

#include "text/names.h"
#include "text/number_text.h"

namespace velmora::hosts::frei0r {
namespace {

std::string FileName(std::string_view effectName) {
    std::string name = "velmora_";
    for (const char c : effectName) name += c == ' ' ? '_' : ToLower(c);
    return name;
}

int TypeOf(ParamKind kind) {
    switch (kind) {
        case kKindSlider:
            return F0R_PARAM_DOUBLE;
        case kKindColour:
            return F0R_PARAM_COLOR;
        case kKindCheckBox:
            return F0R_PARAM_BOOL;
        default:
            return F0R_PARAM_STRING;
    }
}

bool HoldsValue(const effects::ParamRow& param) {
    return param.kind != kKindGroup && param.kind != kKindNone;
}

// In the effect's own panel, a colour and its amount may have the same name.
std::string OwnName(const effects::EffectTable& effect, const effects::ParamRow& param) {
    const auto sharesName = [&](const effects::ParamRow& other) {
        return &other != &param && HoldsValue(other) && IsSameName(other.name, param.name);
    };
    if (!std::ranges::any_of(effect.params, sharesName)) return param.name;
    return std::string(param.name) + (param.kind == kKindColour ? " Colour" : " Amount");
}

std::string QuotedList(std::span<const char* const> texts) {
    std::string list;
    for (const char* text : texts) {
        if (!list.empty()) list += ", ";
        list += text;
    }
    return list;
}

std::string OwnExplanation(const effects::ParamRow& param) {
    switch (param.kind) {
        case kKindSlider:
            return "0 to 1 for " + NumberText(param.minimum) + " to " + NumberText(param.maximum);
        case kKindMenu:
            return "One of " + QuotedList(param.items);
        default:
            return "";
    }
}

}  // namespace

PluginDescription DescribePlugin(const effects::EffectTable& effect) {
    PluginDescription plugin{.effect = effect,
                             .name = std::string("Velmora ") + effect.name,
                             .fileName = FileName(effect.name),
                             .explanation = "The look of old film, with the same result in every host",
                             .params = {}};
    plugin.params = {
        {"preset", F0R_PARAM_STRING, "None or one of " + QuotedList(effect.presetNames), ParamRole::kPreset},
        {"seed", F0R_PARAM_STRING, "0 to 4294967295. Another seed gives other shake, flicker and damage",
         ParamRole::kSeed},
        {"start frame", F0R_PARAM_STRING, "Number of the clip's frame at the host's time 0",
         ParamRole::kStartFrame},
        {"frame rate", F0R_PARAM_STRING, "Frames per second, such as 25 or 30000/1001",
         ParamRole::kFrameRate},
    };
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        const effects::ParamRow& param = effect.params[i];
        if (!HoldsValue(param)) continue;
        plugin.params.push_back(
            {OwnName(effect, param), TypeOf(param.kind), OwnExplanation(param), ParamRole::kOwn, i});
    }
    return plugin;
}

std::optional<std::uint32_t> FindPreset(const effects::EffectTable& effect, std::string_view name) {
    for (std::uint32_t i = 0; i < effect.presetNames.size(); ++i) {
        if (IsSameName(effect.presetNames[i], name)) return i;
    }
    return std::nullopt;
}

std::optional<std::uint32_t> FindItem(const effects::ParamRow& menu, std::string_view text) {
    for (std::uint32_t i = 0; i < menu.items.size(); ++i) {
        if (IsSameName(menu.items[i], text)) return i;
    }
    const auto number = ParseInteger(text);
    if (!number || *number < 0 || *number >= static_cast<std::int64_t>(menu.items.size()))
        return std::nullopt;
    return static_cast<std::uint32_t>(*number);
}

}  // namespace velmora::hosts::frei0r

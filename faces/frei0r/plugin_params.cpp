#include "faces/frei0r/plugin_params.h"

#include <frei0r.h>

#include "text/number_text.h"

namespace velmora::hosts::frei0r {
namespace {

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
                             .fileName = "velmora_" + effects::IdentifierOf(effect.name),
                             .explanation = "The look of old film, with the same result in every host",
                             .params = {}};
    plugin.params = {
        {"preset", F0R_PARAM_STRING,
         "None, the path of a preset file, or one of " + QuotedList(effect.presetNames), ParamRole::kPreset},
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
        plugin.params.push_back({effects::UniqueName(effect, param), TypeOf(param.kind),
                                 OwnExplanation(param), ParamRole::kOwn, i});
    }
    return plugin;
}

std::optional<std::uint32_t> FindItemOrNumber(const effects::ParamRow& menu, std::string_view text) {
    if (const auto item = effects::FindItem(menu, text)) return item;
    const auto number = ParseInteger(text);
    if (!number || *number < 0 || *number >= static_cast<std::int64_t>(menu.items.size()))
        return std::nullopt;
    return static_cast<std::uint32_t>(*number);
}

}  // namespace velmora::hosts::frei0r

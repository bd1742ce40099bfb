#include "programs/reelfx/commands/commands.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "text/number_text.h"
#include "programs/common/settings.h"
#include "programs/reelfx/common/effect_choice.h"

namespace velmora::hosts {
namespace {

using Json = nlohmann::ordered_json;

Json JsonOf(const ParamInfo& param) {
    Json json = {{"name", param.name}, {"kind", KindName(param.kind)}};
    if (param.kind == kKindSlider) {
        json["minimum"] = param.minimum;
        json["maximum"] = param.maximum;
    }
    if (param.kind == kKindMenu) json["items"] = param.items;
    json["default"] = ShownValue(param, param.defaultValue);
    return json;
}

Json JsonOf(const EffectInfo& effect) {
    Json parameters = Json::array();
    for (const ParamInfo& param : effect.params) {
        if (param.HoldsValue()) parameters.push_back(JsonOf(param));
    }
    return {{"name", effect.name}, {"parameters", parameters}, {"presets", effect.presets}};
}

std::string RangeText(const ParamInfo& param) {
    switch (param.kind) {
        case kKindSlider:
            return NumberText(param.minimum) + " to " + NumberText(param.maximum);
        case kKindColour:
            return "#RRGGBB";
        case kKindCheckBox:
            return "on, off";
        default:
            break;
    }
    std::string items;
    for (const std::string& item : param.items) items += (items.empty() ? "" : ", ") + item;
    return items;
}

void Print(const EffectInfo& effect) {
    std::printf("%s\n", effect.name.c_str());
    for (const ParamInfo& param : effect.params) {
        if (!param.HoldsValue()) continue;
        std::printf("  %-18s %-10s %s (%s)\n", param.name.c_str(), KindName(param.kind),
                    RangeText(param).c_str(), ShownValue(param, param.defaultValue).c_str());
    }
    std::printf("  presets: %s\n", QuotedList(effect.presets).c_str());
}

}  // namespace

ExitCode Run(const ListOptions& options) {
    std::vector<EffectInfo> effects = CoreEffects();
    if (options.effect) effects = {effects[FindEffect(effects, *options.effect)]};
    if (options.asJson) {
        Json list = Json::array();
        for (const EffectInfo& effect : effects) list.push_back(JsonOf(effect));
        std::printf("%s\n", list.dump(2).c_str());
        return kExitDone;
    }
    for (const EffectInfo& effect : effects) {
        if (&effect != &effects.front()) std::printf("\n");
        Print(effect);
    }
    return kExitDone;
}

}  // namespace velmora::hosts

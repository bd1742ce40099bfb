#include "programs/reelfx/commands/commands.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "programs/common/settings.h"
#include "programs/reelfx/common/effect_choice.h"

namespace velmora::hosts {
namespace {

using Json = nlohmann::ordered_json;

Json JsonOf(const EffectInfo& effect, const std::string& preset, const effects::EffectSession& session) {
    Json values = Json::array();
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        const ParamInfo& param = effect.params[i];
        if (!param.HoldsValue()) continue;
        values.push_back({{"name", param.name},
                          {"kind", KindName(param.kind)},
                          {"value", ShownValue(param, session.Value(i))}});
    }
    return {{"name", preset}, {"effect", effect.name}, {"parameters", values}};
}

void Print(const EffectInfo& effect, const std::string& preset, const effects::EffectSession& session) {
    std::printf("%s\n", preset.c_str());
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        const ParamInfo& param = effect.params[i];
        if (!param.HoldsValue()) continue;
        std::printf("  %s=%s\n", param.name.c_str(), ShownValue(param, session.Value(i)).c_str());
    }
}

}  // namespace

ExitCode Run(const PresetsOptions& options) {
    const EffectChoice choice({.effect = options.effect});
    const EffectInfo& effect = choice.Info();
    Json list = Json::array();
    for (std::uint32_t i = 0; i < effect.presets.size(); ++i) {
        const auto session = choice.WithPreset(i).NewSession();
        if (options.asJson) {
            list.push_back(JsonOf(effect, effect.presets[i], *session));
        } else {
            Print(effect, effect.presets[i], *session);
        }
    }
    if (options.asJson) std::printf("%s\n", list.dump(2).c_str());
    return kExitDone;
}

}  // namespace velmora::hosts

#include "programs/reelfx/commands/commands.h"

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <filesystem>
#include <nlohmann/json.hpp>

#include "text/number_text.h"
#include "programs/reelfx/common/effect_choice.h"

namespace velmora::hosts {
namespace {

using Json = nlohmann::ordered_json;

constexpr char kExtension[] = ".fxprel";  // and a letter for the effect

Json JsonOf(const PresetRecord& record, const EffectInfo& effect, const std::vector<Setting>& settings) {
    Json values = Json::array();
    for (const Setting& setting : settings) {
        const ParamInfo& param = effect.params[setting.parameter];
        values.push_back({{"name", param.name},
                          {"kind", KindName(param.kind)},
                          {"value", ShownValue(param, setting.value)}});
    }
    return {{"name", PresetName(record)}, {"effect", effect.name}, {"parameters", values}};
}

// Editors find an effect's presets by the extension.
void CheckExtension(const std::string& file, const std::string& effect) {
    const std::vector<EffectInfo>& effects = CoreEffects();
    const auto found = std::ranges::find(effects, effect, &EffectInfo::name);
    const std::string own = std::string(kExtension) + static_cast<char>('a' + (found - effects.begin()));
    std::string given = std::filesystem::path(file).extension().string();
    std::ranges::transform(given, given.begin(),
                           [](unsigned char letter) { return static_cast<char>(std::tolower(letter)); });
    if (given.size() == own.size() && given.starts_with(kExtension) && given != own)
        throw UsageError(file + ": presets of \"" + effect + "\" have the extension " + own);
}

}  // namespace

ExitCode Run(const PresetShowOptions& options) {
    const PresetRecord record = LoadPresetFile(options.file);
    const EffectChoice choice({.presetFile = options.file});
    const EffectInfo& effect = choice.Info();
    const std::vector<Setting> settings = PresetSettings(record, effect, options.file);
    if (options.asJson) {
        // Names in preset files are 8-bit text in any code page: invalid UTF-8 is replaced.
        const Json json = JsonOf(record, effect, settings);
        std::printf("%s\n", json.dump(2, ' ', false, Json::error_handler_t::replace).c_str());
        return kExitDone;
    }
    std::printf("%s\n%s\n", PresetName(record).c_str(), effect.name.c_str());
    for (const Setting& setting : settings) {
        const ParamInfo& param = effect.params[setting.parameter];
        std::printf("  %-18s %s\n", param.name.c_str(), ShownValue(param, setting.value).c_str());
    }
    return kExitDone;
}

ExitCode Run(const PresetSaveOptions& options) {
    const EffectChoice choice(options.effect);
    if (choice.Fades()) throw UsageError("a preset file cannot hold values that change over time");
    CheckExtension(options.file, choice.Info().name);
    const auto session = choice.NewSession();
    std::vector<ValueWord> values;
    for (std::uint32_t i = 0; i < choice.Info().params.size(); ++i) values.push_back(session->Value(i));
    const std::string name =
        options.name.empty() ? std::filesystem::path(options.file).stem().string() : options.name;
    SavePresetFile(options.file, name, choice.Info(), values, options.mayOverwrite);
    return kExitDone;
}

}  // namespace velmora::hosts

#include "programs/reelfx/common/effect_choice.h"

#include <algorithm>
#include <filesystem>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/common/output_place.h"
#include "user_presets/preset_file.h"

namespace velmora::hosts {
namespace {

std::string FieldText(const char (&field)[kPresetNameWidth]) {
    return std::string(field, std::find(field, field + kPresetNameWidth, '\0'));
}

// Truncated to the field, including the terminating zero.
void FillField(char (&field)[kPresetNameWidth], const std::string& text) {
    const std::size_t length = std::min<std::size_t>(text.size(), kPresetNameWidth - 1);
    std::fill(std::copy_n(text.data(), length, field), field + kPresetNameWidth, '\0');
}

std::vector<std::uint32_t> KindsOf(const EffectInfo& effect) {
    std::vector<std::uint32_t> kinds;
    for (const ParamInfo& param : effect.params) kinds.push_back(param.kind);
    return kinds;
}

}  // namespace

PresetRecord LoadPresetFile(const std::string& path) {
    std::error_code ignored;
    if (!std::filesystem::exists(path, ignored)) throw Failure(kExitInput, path + ": no such file");
    PresetRecord record{};
    if (!ReadPreset(path.c_str(), &record)) throw Failure(kExitInput, path + ": is not a preset file");
    return record;
}

std::string PresetName(const PresetRecord& record) {
    return FieldText(record.name);
}
std::string PresetEffect(const PresetRecord& record) {
    return FieldText(record.effectName);
}

std::vector<Setting> PresetSettings(const PresetRecord& record, const EffectInfo& effect,
                                    const std::string& path) {
    if (!IsCompatible(kLibraryName, effect.name.c_str(), KindsOf(effect), &record)) {
        throw Failure(kExitInput, path + ": is a preset of \"" + PresetEffect(record) + "\" in \"" +
                                      FieldText(record.libraryName) + "\" and does not fit \"" + effect.name +
                                      '"');
    }
    std::vector<Setting> settings;
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        if (effect.params[i].HoldsValue()) settings.push_back({i, record.values[i].value});
    }
    return settings;
}

void SavePresetFile(const std::string& path, const std::string& name, const EffectInfo& effect,
                    const std::vector<ValueWord>& values, bool mayOverwrite) {
    if (path == "-") throw UsageError("a preset can only be saved to a file, not to standard output");
    OutputPlace place(path, mayOverwrite);
    PresetRecord record{};
    FillField(record.name, name);
    FillField(record.libraryName, kLibraryName);
    FillField(record.effectName, effect.name);
    record.count = static_cast<std::int32_t>(effect.params.size());
    for (std::size_t i = 0; i < effect.params.size(); ++i) {
        record.values[i] = {values[i], 0, effect.params[i].kind};
    }
    errno = 0;
    if (!WritePreset(place.Address().c_str(), &record)) {
        throw Failure(kExitOutput, path + ": cannot be written" + SystemReason());
    }
    place.Keep();
}

}  // namespace velmora::hosts

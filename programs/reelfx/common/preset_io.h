// Preset files on the command line: read, checked against an effect, and written.
#pragma once

#include <string>
#include <vector>

#include "programs/common/effect_info.h"
#include "programs/common/settings.h"
#include "api/host_api.h"

namespace velmora::hosts {

// Throws Failure (kExitInput) when the file cannot be read or is not a preset.
PresetRecord LoadPresetFile(const std::string& path);

// The record's texts and values; names end at a zero or at the end of their field.
std::string PresetName(const PresetRecord& record);
std::string PresetEffect(const PresetRecord& record);

// The record's values for the effect's parameters. Throws Failure (kExitInput) when the preset belongs to
// another effect or library; `path` is for the message.
std::vector<Setting> PresetSettings(const PresetRecord& record, const EffectInfo& effect,
                                    const std::string& path);

// `values` are stored forms in the effect's parameter order. Throws Failure (kExitOutput).
void SavePresetFile(const std::string& path, const std::string& name, const EffectInfo& effect,
                    const std::vector<ValueWord>& values, bool mayOverwrite);

}  // namespace velmora::hosts

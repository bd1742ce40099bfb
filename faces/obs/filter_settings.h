// A filter's settings: as OBS keeps them in a scene collection, as preset files, and as the panel that the user sees.
//
// In a scene collection:
//
//   key                value
//   preset             name of the preset that was chosen; empty when the values are the user's own
//   applied_preset     the preset whose values are in the settings. Where it differs from `preset`, as after a change
//                      by a script, the preset is in force and its values are still to be written
//   seed               0..4294967295
//   source_time        whether frames follow the source's position, see film_filter.h
//   the effect's own   slider: number as shown; colour: 0xAABBGGRR; menu: the item's text; check box: boolean.
//                      Keys are the names in lower case with "_" for spaces, such as "film_gamma"
//
// Not for several threads at once: OBS does not lock settings either.
#pragma once

#include <obs.h>

#include <cstdint>
#include <string>
#include <vector>

#include "api/host_api.h"
#include "effects/effect_table.h"

namespace velmora::hosts::obs {

inline constexpr const char* kPresetKey = "preset";
inline constexpr const char* kAppliedPresetKey = "applied_preset";
inline constexpr const char* kSeedKey = "seed";
inline constexpr const char* kSourceTimeKey = "source_time";

// One of the five filters. Kept as long as the module is loaded.
struct FilterDescription {
    const effects::EffectTable& effect;
    std::uint32_t index;             // in kAllEffects
    std::string id;                  // "velmora_film_pro"
    std::string name;                // "Velmora Film Pro"
    std::vector<std::string> keys;   // by parameter; empty for group markers
    std::vector<std::string> names;  // by parameter, in English, unique
};

[[nodiscard]] FilterDescription DescribeFilter(std::uint32_t index);

struct FilterValues {
    std::vector<ValueWord> own;  // by parameter, in stored format
    std::uint32_t seed = 0;
    bool followsSource = false;
};

void SetDefaults(const FilterDescription& filter, obs_data_t* settings);

// The values in force.
[[nodiscard]] FilterValues ReadValues(const FilterDescription& filter, obs_data_t* settings);

// Sets one value; does nothing for a group marker.
void WriteValue(const FilterDescription& filter, std::uint32_t param, ValueWord value, obs_data_t* settings);

// Writes the values of a preset that was chosen but not yet applied. False when there was nothing to write.
bool WriteChosenPreset(const FilterDescription& filter, obs_data_t* settings);
// True when WriteChosenPreset has something to do.
[[nodiscard]] bool IsPresetPending(obs_data_t* settings);

// Makes the settings the user's own if their values are no longer those of the preset.
void DropPresetIfChanged(const FilterDescription& filter, obs_data_t* settings);

// Whether the effect leaves every picture alone, as with its defaults.
[[nodiscard]] bool IsNeutral(const FilterDescription& filter, const FilterValues& values);

// Preset files of the library (user_presets/preset_file.h) as settings (preset_files.cpp).

// The extension of an effect's preset files, without the dot.
[[nodiscard]] std::string PresetFileExtension(const FilterDescription& filter);

// File names are UTF-8, as OBS has them.

// Writes a preset's values into the settings, which are then the user's own. False, with the settings unchanged, when
// the file cannot be read or belongs to another effect.
[[nodiscard]] bool LoadPresetFile(const FilterDescription& filter, const std::string& path,
                                  obs_data_t* settings);

// Writes the values in force. The preset gets the file's name; a name without the extension gets it. False when the
// file cannot be written.
[[nodiscard]] bool SavePresetFile(const FilterDescription& filter, const std::string& path,
                                  obs_data_t* settings);

// The panel of a filter: OBS' properties, made from the effect's table (filter_panel.cpp).

// Settings that the panel uses for a moment only: a path that the user chooses is used at once and cleared.
inline constexpr const char* kLoadPresetKey = "load_preset";
inline constexpr const char* kSavePresetKey = "save_preset";
// Other properties without a setting.
inline constexpr const char* kNewSeedKey = "new_seed";
inline constexpr const char* kMessageKey = "message";

// The caller owns the result. `source` is the filter that the panel is for; null when OBS asks only what there is.
[[nodiscard]] obs_properties_t* MakePanel(const FilterDescription& filter, obs_source_t* source);

// The text in OBS' language whose English is `english`; that itself when there is no translation. Valid until OBS
// changes its language. The module has the texts (plugin.cpp); the build makes its locale files from the library's
// language file (write_locales.py).
[[nodiscard]] const char* Text(const char* english);
[[nodiscard]] inline const char* Text(const std::string& english) {
    return Text(english.c_str());
}

}  // namespace velmora::hosts::obs

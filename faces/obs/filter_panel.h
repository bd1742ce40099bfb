// The panel of a filter: OBS' properties, made from the effect's table.
#pragma once

#include <obs.h>

#include <string>

#include "faces/obs/filter_settings.h"

namespace velmora::hosts::obs {

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

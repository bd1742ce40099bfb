// Preset files of the library (presets/preset_file.h) as a filter's settings.
#pragma once

#include <obs.h>

#include <string>

#include "faces/obs/filter_settings.h"

namespace velmora::hosts::obs {

// The extension of an effect's preset files, without a point.
[[nodiscard]] std::string PresetFileExtension(const FilterDescription& filter);

// File names are UTF-8, as OBS has them.

// Writes a preset's values into the settings, which are then the user's own. False, with the settings unchanged, when
// the file cannot be read or is none of this effect.
[[nodiscard]] bool LoadPresetFile(const FilterDescription& filter, const std::string& path,
                                  obs_data_t* settings);

// Writes the values in force. The preset gets the file's name; a name without the extension gets it. False when the
// file cannot be written.
[[nodiscard]] bool SavePresetFile(const FilterDescription& filter, const std::string& path,
                                  obs_data_t* settings);

}  // namespace velmora::hosts::obs

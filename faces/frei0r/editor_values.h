// What the editors' files have in common: values and lists as texts.
#pragma once

#include <string>
#include <vector>

#include "faces/frei0r/plugin_params.h"

namespace velmora::hosts::frei0r {

// "Preset", "Start Frame", "X Jitter": as a control is labelled.
std::string LabelOf(const PluginParam& param);

// What a list offers, the value that is passed on being the text itself: presets after "none", menu items, usual
// frame rates after "none". Empty for parameters that are no lists.
std::vector<std::string> ChoicesOf(const PluginDescription& plugin, const PluginParam& param);

// "0.5", "1", "#000000", "Blotchy", "none".
std::string DefaultOf(const PluginDescription& plugin, const PluginParam& param);

// The effect's row of an own parameter.
inline const effects::ParamRow& RowOf(const PluginDescription& plugin, const PluginParam& param) {
    return plugin.effect.params[param.own];
}

// "a;b;c"
std::string Joined(const std::vector<std::string>& texts, const char* separator);

// In double quotes, as JavaScript and YAML read it. Texts of the tables need no other escapes.
std::string Quoted(const std::string& text);

}  // namespace velmora::hosts::frei0r

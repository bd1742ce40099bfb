// Values and lists as texts, for all kinds of editor files.
#pragma once

#include <string>
#include <vector>

#include "faces/frei0r/plugin_params.h"

namespace velmora::hosts::frei0r {

// The label of a control: "Preset", "Start Frame", "X Jitter".
std::string LabelOf(const PluginParam& param);

// The entries of a list; the value passed on is the text itself: "none" and the presets, menu items, "none"
// and common frame rates. Empty for parameters that are not lists.
std::vector<std::string> ChoicesOf(const PluginDescription& plugin, const PluginParam& param);

// "0.5", "1", "#000000", "Blotchy", "none".
std::string DefaultOf(const PluginDescription& plugin, const PluginParam& param);

// The row of the effect's table for one of its own parameters.
inline const effects::ParamRow& RowOf(const PluginDescription& plugin, const PluginParam& param) {
    return plugin.effect.params[param.own];
}

// "a;b;c"
std::string Joined(const std::vector<std::string>& texts, const char* separator);

// Quoted for JavaScript and YAML. The texts of the tables need no other escapes.
std::string Quoted(const std::string& text);

}  // namespace velmora::hosts::frei0r

// What editors want to know of a plug-in beside the plug-in itself, written from the effect's table.
#pragma once

#include <string>
#include <vector>

#include "faces/frei0r/plugin_params.h"

namespace velmora::hosts::frei0r {

// Kdenlive's effect file: the sliders in their shown range, presets and menus as lists. Parameters are bound by
// index, as MLT reads them first.
std::string KdenliveEffect(const PluginDescription& plugin);

// Shotcut's description of a filter and the panel that it names.
std::string ShotcutMetadata(const PluginDescription& plugin);
std::string ShotcutPanel(const PluginDescription& plugin);

// The description for MLT's own data folder, in place of the one that MLT derives from the plug-in: with values to
// choose from. Identifiers are the indices, as in MLT's.
std::string MltMetadata(const PluginDescription& plugin);

// What the files have in common (editor_values.cpp): values and lists as texts.

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

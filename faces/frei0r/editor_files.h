// The files with which plug-ins are described to editors, written from the effect's table.
#pragma once

#include <string>
#include <vector>

#include "faces/frei0r/plugin_params.h"

namespace velmora::hosts::frei0r {

// Kdenlive's effect file, with sliders in their shown range, and menus as lists. Parameters are bound by index,
// which MLT looks up first.
std::string KdenliveEffect(const PluginDescription& plugin);

// The built-in presets as Kdenlive keeps a user's presets of an effect.
std::string KdenlivePresets(const PluginDescription& plugin);

// Shotcut's description of a filter, and its panel.
std::string ShotcutMetadata(const PluginDescription& plugin);
std::string ShotcutPanel(const PluginDescription& plugin);

// The description for MLT's data folder. Unlike the one that MLT derives from the plug-in, it lists the
// values of presets and menus. Identifiers are the indices, as in MLT's own.
std::string MltMetadata(const PluginDescription& plugin);

// What the files have in common (editor_values.cpp): values and lists as texts.

// "Preset", "Start Frame", "X Jitter": as a control is labelled.
std::string LabelOf(const PluginParam& param);

// What a list offers, the value that is passed on being the text itself: presets after "none", menu items, usual
// frame rates after "none". Empty for parameters that are no lists.
std::vector<std::string> ChoicesOf(const PluginDescription& plugin, const PluginParam& param);

// "0.5", "1", "#000000", "Blotchy", "none".
std::string DefaultOf(const PluginDescription& plugin, const PluginParam& param);

// The value of an own parameter in the built-in preset, as a text like DefaultOf's.
std::string PresetValueOf(const PluginDescription& plugin, std::uint32_t preset, const PluginParam& param);

// The order in which a panel shows the parameters: where the clip starts comes first, because every cut needs it, and
// the effect's own parameters after it. The parameter "preset" is left out: editors offer the built-in presets as
// presets of their own, which set every control.
std::vector<std::size_t> PanelOrder(const PluginDescription& plugin);

// The effect's row of an own parameter.
inline const effects::ParamRow& RowOf(const PluginDescription& plugin, const PluginParam& param) {
    return plugin.effect.params[param.own];
}

// "a;b;c"
std::string Joined(const std::vector<std::string>& texts, const char* separator);

// In double quotes, as JavaScript and YAML read it. Texts of the tables need no other escapes.
std::string Quoted(const std::string& text);

}  // namespace velmora::hosts::frei0r

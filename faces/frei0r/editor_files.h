// The files with which plug-ins are described to editors, written from the effect's table.
#pragma once

#include <string>

#include "faces/frei0r/plugin_params.h"

namespace velmora::hosts::frei0r {

// Kdenlive's effect file, with sliders in their shown range, and presets and menus as lists. Parameters are
// bound by index, which MLT looks up first.
std::string KdenliveEffect(const PluginDescription& plugin);

// Shotcut's description of a filter, and its panel.
std::string ShotcutMetadata(const PluginDescription& plugin);
std::string ShotcutPanel(const PluginDescription& plugin);

// The description for MLT's data folder. Unlike the one that MLT derives from the plug-in, it lists the
// values of presets and menus. Identifiers are the indices, as in MLT's own.
std::string MltMetadata(const PluginDescription& plugin);

}  // namespace velmora::hosts::frei0r

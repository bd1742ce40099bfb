// What editors want to know of a plug-in beside the plug-in itself, written from the effect's table.
#pragma once

#include <string>

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

}  // namespace velmora::hosts::frei0r

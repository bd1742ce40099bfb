// write_editor_files FOLDER: writes the editors' files for all plug-ins, in the editors' own layout:
//   kdenlive/effects/PLUGIN.xml, kdenlive/presets/frei0r.PLUGIN.json, shotcut/filters/PLUGIN/{meta,ui}.qml, mlt/frei0r/filter_frei0r.PLUGIN.yml

#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <stdexcept>

#include "faces/frei0r/editor_files.h"

namespace {

void Write(const std::filesystem::path& path, const std::string& text) {
    std::filesystem::create_directories(path.parent_path());
    std::ofstream file(path, std::ios::binary);
    file << text;
    if (!file.flush()) throw std::runtime_error("cannot write " + path.string());
}

void WriteAll(const std::filesystem::path& folder) {
    using namespace velmora::hosts::frei0r;
    for (const velmora::effects::EffectTable* effect : velmora::effects::kAllEffects) {
        const PluginDescription plugin = DescribePlugin(*effect);
        Write(folder / "kdenlive/effects" / (plugin.fileName + ".xml"), KdenliveEffect(plugin));
        Write(folder / "kdenlive/presets" / ("frei0r." + plugin.fileName + ".json"), KdenlivePresets(plugin));
        Write(folder / "shotcut/filters" / plugin.fileName / "meta.qml", ShotcutMetadata(plugin));
        Write(folder / "shotcut/filters" / plugin.fileName / "ui.qml", ShotcutPanel(plugin));
        Write(folder / "mlt/frei0r" / ("filter_frei0r." + plugin.fileName + ".yml"), MltMetadata(plugin));
    }
}

}  // namespace

int main(int count, char** arguments) {
    if (count != 2) {
        std::cerr << "usage: write_editor_files FOLDER\n";
        return 2;
    }
    try {
        WriteAll(arguments[1]);
    } catch (const std::exception& error) {
        std::cerr << "write_editor_files: " << error.what() << '\n';
        return 1;
    }
    return 0;
}

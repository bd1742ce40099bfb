#include <frei0r.h>

#include "text/number_text.h"
#include "faces/frei0r/editor_files.h"

namespace velmora::hosts::frei0r {
namespace {

std::string Escaped(const std::string& text) {
    std::string escaped;
    for (const char c : text) {
        switch (c) {
            case '&':
                escaped += "&amp;";
                break;
            case '<':
                escaped += "&lt;";
                break;
            case '"':
                escaped += "&quot;";
                break;
            default:
                escaped += c;
        }
    }
    return escaped;
}

std::string Attribute(const char* name, const std::string& value) {
    return std::string(" ") + name + "=\"" + Escaped(value) + '"';
}

// Kdenlive shows a value times a factor, without an offset: a range from -100 to 100 is shown as 0 to 100.
std::string SliderRange(const effects::ParamRow& row) {
    const std::string top = NumberText(row.maximum);
    return Attribute("min", "0") + Attribute("max", top) + Attribute("factor", top) +
           Attribute("decimals", "2");
}

std::string TypeAttributes(const PluginDescription& plugin, const PluginParam& param) {
    if (const auto choices = ChoicesOf(plugin, param); !choices.empty()) {
        return Attribute("type", "list") + Attribute("paramlist", Joined(choices, ";"));
    }
    if (param.role != ParamRole::kOwn) {
        // The largest whole number that Kdenlive's spin boxes can hold.
        return Attribute("type", "constant") + Attribute("min", "0") + Attribute("max", "2147483647") +
               Attribute("decimals", "0");
    }
    switch (param.type) {
        case F0R_PARAM_BOOL:
            return Attribute("type", "bool");
        case F0R_PARAM_COLOR:
            return Attribute("type", "color");
        default:
            return Attribute("type", "animated") + SliderRange(RowOf(plugin, param));
    }
}

std::string Label(const PluginDescription& plugin, const PluginParam& param) {
    const bool isShifted = param.type == F0R_PARAM_DOUBLE && RowOf(plugin, param).minimum < 0.0f;
    return LabelOf(param) +
           (isShifted ? " (neutral: " + NumberText(RowOf(plugin, param).maximum / 2.0) + ")" : "");
}

}  // namespace

std::string KdenliveEffect(const PluginDescription& plugin) {
    const std::string service = "frei0r." + plugin.fileName;
    std::string text = "<?xml version=\"1.0\"?>\n<!DOCTYPE kpartgui>\n<effect" + Attribute("tag", service) +
                       Attribute("id", service) + Attribute("type", "video") + ">\n    <name>" +
                       Escaped(plugin.name) + "</name>\n    <description>" + Escaped(plugin.explanation) +
                       "</description>\n    <author>Velmora</author>\n";
    for (const std::size_t i : PanelOrder(plugin)) {
        const PluginParam& param = plugin.params[i];
        text += "    <parameter" + Attribute("name", std::to_string(i)) + TypeAttributes(plugin, param) +
                Attribute("default", DefaultOf(plugin, param)) + ">\n";
        if (const auto choices = ChoicesOf(plugin, param); !choices.empty()) {
            text += "        <paramlistdisplay>" + Escaped(Joined(choices, ",")) + "</paramlistdisplay>\n";
        }
        text += "        <name>" + Escaped(Label(plugin, param)) + "</name>\n    </parameter>\n";
    }
    return text + "</effect>\n";
}

std::string KdenlivePresets(const PluginDescription& plugin) {
    std::vector<std::string> presets;
    for (std::uint32_t preset = 0; preset < plugin.effect.presetNames.size(); ++preset) {
        std::vector<std::string> values;
        for (std::size_t i = 0; i < plugin.params.size(); ++i) {
            const PluginParam& param = plugin.params[i];
            if (param.role != ParamRole::kOwn) continue;
            // A control that can be animated holds keyframes, here a single one.
            const std::string start = param.type == F0R_PARAM_DOUBLE ? "0=" : "";
            values.push_back("{\"name\": " + Quoted(std::to_string(i)) +
                             ", \"value\": " + Quoted(start + PresetValueOf(plugin, preset, param)) + '}');
        }
        presets.push_back("    {" + Quoted(plugin.effect.presetNames[preset]) + ": [\n        " +
                          Joined(values, ",\n        ") + "]}");
    }
    return "[\n" + Joined(presets, ",\n") + "\n]\n";
}

}  // namespace velmora::hosts::frei0r

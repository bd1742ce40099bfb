#include <frei0r.h>

#include "faces/frei0r/editor_files.h"

namespace velmora::hosts::frei0r {
namespace {

const char* TypeName(int type) {
    switch (type) {
        case F0R_PARAM_BOOL:
            return "boolean";
        case F0R_PARAM_DOUBLE:
            return "float";
        case F0R_PARAM_COLOR:
            return "color";
        default:
            return "string";
    }
}

std::string Parameter(const PluginDescription& plugin, std::size_t index) {
    const PluginParam& param = plugin.params[index];
    std::string text =
        "  - identifier: " + Quoted(std::to_string(index)) + "\n    title: " + Quoted(LabelOf(param)) +
        "\n    type: " + TypeName(param.type) +
        "\n    readonly: no\n    mutable: yes\n    default: " + Quoted(DefaultOf(plugin, param)) + '\n';
    if (!param.explanation.empty()) text += "    description: " + Quoted(param.explanation) + '\n';
    if (param.type == F0R_PARAM_DOUBLE) text += "    minimum: 0\n    maximum: 1\n    animation: yes\n";
    if (const auto choices = ChoicesOf(plugin, param); !choices.empty()) {
        text += "    values:\n";
        for (const std::string& choice : choices) text += "      - " + Quoted(choice) + '\n';
        text += "    widget: combo\n";
    }
    return text;
}

}  // namespace

std::string MltMetadata(const PluginDescription& plugin) {
    std::string text = "schema_version: 0.3\ntype: filter\nidentifier: frei0r." + plugin.fileName +
                       "\ntitle: " + Quoted(plugin.name) +
                       "\nversion: 1\ncreator: Velmora\nlanguage: en\ntags:\n  - Video\ndescription: " +
                       Quoted(plugin.explanation) + "\nparameters:\n";
    for (std::size_t i = 0; i < plugin.params.size(); ++i) text += Parameter(plugin, i);
    return text;
}

}  // namespace velmora::hosts::frei0r

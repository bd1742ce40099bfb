#include "faces/frei0r/editor_files.h"

#include <frei0r.h>

#include <cstdio>

#include "text/number_text.h"

namespace velmora::hosts::frei0r {
namespace {

constexpr const char* kFrameRates[] = {"23.976", "24", "25", "29.97", "30", "50", "59.94", "60"};

template <class Texts>
std::vector<std::string> NoneAnd(const Texts& texts) {
    std::vector<std::string> all = {"none"};
    all.insert(all.end(), std::begin(texts), std::end(texts));
    return all;
}

}  // namespace

std::string LabelOf(const PluginParam& param) {
    std::string label = param.name;
    bool isFirst = true;
    for (char& c : label) {
        if (isFirst && c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
        isFirst = c == ' ';
    }
    return label;
}

std::vector<std::string> ChoicesOf(const PluginDescription& plugin, const PluginParam& param) {
    switch (param.role) {
        case ParamRole::kPreset:
            return NoneAnd(plugin.effect.presetNames);
        case ParamRole::kFrameRate:
            return NoneAnd(kFrameRates);
        case ParamRole::kOwn: {
            const auto& items = RowOf(plugin, param).items;
            return {items.begin(), items.end()};
        }
        default:
            return {};
    }
}

std::string DefaultOf(const PluginDescription& plugin, const PluginParam& param) {
    switch (param.role) {
        case ParamRole::kPreset:
        case ParamRole::kFrameRate:
            return "none";
        case ParamRole::kSeed:
        case ParamRole::kStartFrame:
            return "0";
        case ParamRole::kOwn:
            break;
    }
    const effects::ParamRow& row = RowOf(plugin, param);
    switch (row.kind) {
        case kKindSlider:
            return NumberText(row.defaultValue.number);
        case kKindCheckBox:
            return row.defaultValue.flag != 0 ? "1" : "0";
        case kKindColour: {
            const std::uint32_t colour = row.defaultValue.colour;
            char text[8];
            std::snprintf(text, sizeof(text), "#%02x%02x%02x", colour & 0xFFu, colour >> 8 & 0xFFu,
                          colour >> 16 & 0xFFu);
            return text;
        }
        default:
            return row.items[row.defaultValue.count];
    }
}

std::string Joined(const std::vector<std::string>& texts, const char* separator) {
    std::string joined;
    for (const std::string& text : texts) {
        if (!joined.empty()) joined += separator;
        joined += text;
    }
    return joined;
}

std::string Quoted(const std::string& text) {
    std::string quoted = "\"";
    for (const char c : text) {
        if (c == '"' || c == '\\') quoted += '\\';
        quoted += c;
    }
    return quoted + '"';
}

}  // namespace velmora::hosts::frei0r

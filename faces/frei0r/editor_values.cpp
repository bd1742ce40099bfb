#include "faces/frei0r/editor_files.h"

#include <frei0r.h>

#include <cstdio>

#include "effects/effect_queries.h"
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

std::string ValueText(const effects::ParamRow& row, ValueWord value) {
    switch (row.kind) {
        case kKindSlider:
            return NumberText(value.number);
        case kKindCheckBox:
            return value.flag != 0 ? "1" : "0";
        case kKindColour: {
            char text[8];
            std::snprintf(text, sizeof(text), "#%02x%02x%02x", value.colour & 0xFFu,
                          value.colour >> 8 & 0xFFu, value.colour >> 16 & 0xFFu);
            return text;
        }
        default:
            return row.items[value.count];
    }
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
    return ValueText(row, row.defaultValue);
}

std::string PresetValueOf(const PluginDescription& plugin, std::uint32_t preset, const PluginParam& param) {
    PresetCell cell;
    if (!effects::CopyPresetValue(plugin.effect, preset, param.own, &cell)) return DefaultOf(plugin, param);
    return ValueText(RowOf(plugin, param), cell.value);
}

std::vector<std::size_t> PanelOrder(const PluginDescription& plugin) {
    std::vector<std::size_t> order;
    for (const ParamRole role :
         {ParamRole::kStartFrame, ParamRole::kFrameRate, ParamRole::kSeed, ParamRole::kOwn}) {
        for (std::size_t i = 0; i < plugin.params.size(); ++i) {
            if (plugin.params[i].role == role) order.push_back(i);
        }
    }
    return order;
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

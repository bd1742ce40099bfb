#include "programs/common/settings.h"

#include <optional>
#include <vector>

#include "text/number_text.h"
#include "text/names.h"

namespace velmora::hosts {
namespace {

ValueWord Word(std::uint32_t bits) {
    ValueWord word;
    word.bits = bits;
    return word;
}

std::uint32_t SwapRedAndBlue(std::uint32_t colour) {
    return (colour & 0x00FF00u) | ((colour >> 16) & 0xFFu) | ((colour & 0xFFu) << 16);
}

std::string ColourText(std::uint32_t colour) {
    std::string text = "#";
    text += std::string_view(HexText(SwapRedAndBlue(colour & 0xFFFFFFu))).substr(4);  // behind "0x00"
    return text;
}

std::optional<ValueWord> ParseSlider(const ParamInfo& param, std::string_view text) {
    const auto shown = ParseNumber(text);
    if (!shown || *shown < param.minimum || *shown > param.maximum) return std::nullopt;
    ValueWord word;
    word.number = NormalisedSlider({param.minimum, param.maximum}, *shown);
    return word;
}

std::optional<ValueWord> ParseColour(std::string_view text) {
    if (!text.starts_with('#') || text.size() != 7) return std::nullopt;
    const auto rgb = ParseHexWord(text.substr(1));
    if (!rgb) return std::nullopt;
    return Word(SwapRedAndBlue(*rgb));
}

std::optional<ValueWord> ParseMenu(const ParamInfo& param, std::string_view text) {
    for (std::size_t item = 0; item < param.items.size(); ++item) {
        if (IsSameName(param.items[item], text)) return Word(static_cast<std::uint32_t>(item));
    }
    const auto item = ParseInteger(text);
    if (!item || *item < 0 || *item >= static_cast<std::int64_t>(param.items.size())) return std::nullopt;
    return Word(static_cast<std::uint32_t>(*item));
}

std::optional<ValueWord> ParseCheckBox(std::string_view text) {
    for (const char* yes : {"on", "yes", "true", "1"}) {
        if (IsSameName(text, yes)) return Word(1);
    }
    for (const char* no : {"off", "no", "false", "0"}) {
        if (IsSameName(text, no)) return Word(0);
    }
    return std::nullopt;
}

std::optional<ValueWord> ParseValue(const ParamInfo& param, std::string_view text) {
    switch (param.kind) {
        case kKindSlider:
            return ParseSlider(param, text);
        case kKindColour:
            return ParseColour(text);
        case kKindMenu:
            return ParseMenu(param, text);
        case kKindCheckBox:
            return ParseCheckBox(text);
        default:
            return std::nullopt;
    }
}

std::string Expected(const ParamInfo& param) {
    switch (param.kind) {
        case kKindSlider:
            return "a number from " + NumberText(param.minimum) + " to " + NumberText(param.maximum);
        case kKindColour:
            return "a colour as #RRGGBB";
        case kKindMenu:
            return "one of " + QuotedList(param.items);
        default:
            return "on or off";
    }
}

[[noreturn]] void FailUnknown(const EffectInfo& effect, std::string_view name) {
    std::vector<std::string> names;
    for (const ParamInfo& param : effect.params) {
        if (param.HoldsValue() && (names.empty() || names.back() != param.name)) names.push_back(param.name);
    }
    throw UsageError('"' + effect.name + "\" has no parameter \"" + std::string(name) + "\"" +
                     InsteadOf(name, names, "it has"));
}

}  // namespace

float NormalisedSlider(const SliderRange& range, double shown) {
    return static_cast<float>((shown - range.minimum) / (double{range.maximum} - range.minimum));
}

Setting ParseSetting(const EffectInfo& effect, std::string_view text) {
    const std::size_t equals = text.find('=');
    if (equals == std::string_view::npos || equals == 0) {
        throw UsageError("settings have the form NAME=VALUE, not \"" + std::string(text) + '"');
    }
    const std::string_view name = text.substr(0, equals);
    const std::string_view valueText = text.substr(equals + 1);
    std::string expected;
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        const ParamInfo& param = effect.params[i];
        if (!param.HoldsValue() || !IsSameName(param.name, name)) continue;
        if (const auto value = ParseValue(param, valueText)) return {i, *value};
        expected += (expected.empty() ? "" : " or ") + Expected(param);
    }
    if (expected.empty()) FailUnknown(effect, name);
    throw UsageError('"' + std::string(name) + "\" takes " + expected + ", not \"" + std::string(valueText) +
                     '"');
}

std::string ShownValue(const ParamInfo& param, ValueWord value) {
    switch (param.kind) {
        case kKindSlider:
            return NumberText(param.minimum + double{value.number} * (double{param.maximum} - param.minimum));
        case kKindColour:
            return ColourText(value.colour);
        case kKindMenu: {
            const auto item = static_cast<std::size_t>(value.count);
            return item < param.items.size() ? param.items[item] : NumberText(value.item);
        }
        case kKindCheckBox:
            return value.flag != 0 ? "on" : "off";
        default:
            return "";
    }
}

}  // namespace velmora::hosts

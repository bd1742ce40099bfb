#include "effects/describe.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>

namespace velmora::effects {
namespace {

constexpr std::string_view kColourSuffix = " Color";

char LowerCase(char c) noexcept {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

bool SameText(std::string_view a, std::string_view b) noexcept {
    return std::ranges::equal(a, b, {}, LowerCase, LowerCase);
}

std::string_view Trimmed(std::string_view text) noexcept {
    constexpr std::string_view kBlanks = " \t";
    const std::size_t first = text.find_first_not_of(kBlanks);
    if (first == std::string_view::npos) return {};
    return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

void AppendName(std::string& list, std::string_view name) {
    if (!list.empty()) list += ", ";
    list.append("\"").append(name).append("\"");
}

std::string NumberText(double value) {
    constexpr int kDecimals = 4;
    // Rounded first, so that what is nearly 0 shows as 0 and not as -0.
    const double rounded = std::round(value * 10000.0) / 10000.0 + 0.0;
    char text[64];
    const auto end =
        std::to_chars(text, text + sizeof text, rounded, std::chars_format::fixed, kDecimals).ptr;
    std::string_view shown(text, static_cast<std::size_t>(end - text));
    shown = shown.substr(0, shown.find_last_not_of('0') + 1);
    if (shown.ends_with('.')) shown.remove_suffix(1);
    return std::string(shown);
}

std::optional<ValueWord> ParseSlider(const ParamRow& param, std::string_view text) noexcept {
    if (text.starts_with('+')) text.remove_prefix(1);
    double shown = 0.0;
    const auto [end, failure] = std::from_chars(text.data(), text.data() + text.size(), shown);
    if (failure != std::errc() || end != text.data() + text.size()) return std::nullopt;
    const double minimum = param.minimum;
    const double maximum = param.maximum;
    if (!(shown >= minimum && shown <= maximum)) return std::nullopt;
    return ValueWord{.number = static_cast<float>((shown - minimum) / (maximum - minimum))};
}

// Written red first, as on the web; stored with red in the lowest byte.
std::optional<ValueWord> ParseColour(std::string_view text) noexcept {
    if (text.starts_with('#')) text.remove_prefix(1);
    std::uint32_t rgb = 0;
    const auto [end, failure] = std::from_chars(text.data(), text.data() + text.size(), rgb, 16);
    if (text.size() != 6 || failure != std::errc() || end != text.data() + text.size()) return std::nullopt;
    return ValueWord{.colour = (rgb >> 16) | (rgb & 0xFF00u) | (rgb & 0xFFu) << 16};
}

std::optional<ValueWord> ParseItem(const ParamRow& param, std::string_view text) noexcept {
    for (std::size_t i = 0; i < param.items.size(); ++i) {
        if (SameText(param.items[i], text)) return ValueWord{.item = static_cast<std::int32_t>(i)};
    }
    return std::nullopt;
}

std::optional<ValueWord> ParseFlag(std::string_view text) noexcept {
    for (const std::string_view on : {"on", "yes", "true", "1"}) {
        if (SameText(on, text)) return ValueWord{.bits = 1};
    }
    for (const std::string_view off : {"off", "no", "false", "0"}) {
        if (SameText(off, text)) return ValueWord{.bits = 0};
    }
    return std::nullopt;
}

std::optional<ValueWord> ParseByKind(const ParamRow& param, std::string_view text) noexcept {
    switch (param.kind) {
        case kKindSlider:
            return ParseSlider(param, text);
        case kKindColour:
            return ParseColour(text);
        case kKindMenu:
            return ParseItem(param, text);
        case kKindCheckBox:
            return ParseFlag(text);
        default:
            return std::nullopt;
    }
}

}  // namespace

const EffectTable* FindEffect(std::string_view name) noexcept {
    for (const EffectTable* effect : kAllEffects) {
        if (SameText(effect->name, name)) return effect;
    }
    return nullptr;
}

std::optional<std::uint32_t> FindPreset(const EffectTable& effect, std::string_view name) noexcept {
    for (std::uint32_t i = 0; i < effect.presetNames.size(); ++i) {
        if (SameText(effect.presetNames[i], name)) return i;
    }
    return std::nullopt;
}

std::string ParamKey(const EffectTable& effect, std::uint32_t index) {
    const ParamRow& param = effect.params[index];
    std::string key = param.name;
    if (param.kind != kKindColour) return key;
    const auto isAmount = [&](const ParamRow& other) {
        return other.kind == kKindSlider && other.name == key;
    };
    if (std::ranges::any_of(effect.params, isAmount)) key += kColourSuffix;
    return key;
}

std::optional<std::uint32_t> FindParam(const EffectTable& effect, std::string_view name, ParamKind kind) {
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        const ParamRow& param = effect.params[i];
        if (param.kind == kKindGroup || (kind != kKindNone && param.kind != kind)) continue;
        if (SameText(ParamKey(effect, i), name)) return i;
        if (kind != kKindNone && SameText(param.name, name)) return i;
    }
    return std::nullopt;
}

std::string ListEffects() {
    std::string list;
    for (const EffectTable* effect : kAllEffects) AppendName(list, effect->name);
    return list;
}

std::string ListParams(const EffectTable& effect) {
    std::string list;
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        if (effect.params[i].kind != kKindGroup) AppendName(list, ParamKey(effect, i));
    }
    return list;
}

std::string ListPresets(const EffectTable& effect) {
    std::string list;
    for (const char* name : effect.presetNames) AppendName(list, name);
    return list;
}

std::string_view KindName(ParamKind kind) noexcept {
    switch (kind) {
        case kKindSlider:
            return "slider";
        case kKindColour:
            return "color";
        case kKindMenu:
            return "menu";
        case kKindCheckBox:
            return "check box";
        case kKindGroup:
            return "group";
        case kKindNone:
            break;
    }
    return "";
}

std::string AllowedValues(const ParamRow& param) {
    switch (param.kind) {
        case kKindSlider:
            return "a number from " + NumberText(param.minimum) + " to " + NumberText(param.maximum);
        case kKindColour:
            return "a color #RRGGBB";
        case kKindCheckBox:
            return "on or off";
        case kKindMenu:
            break;
        default:
            return "no value";
    }
    std::string list = "one of ";
    for (const char* item : param.items) list.append(item == param.items.front() ? "" : ", ").append(item);
    return list;
}

ParsedValue ParseShown(const ParamRow& param, std::string_view text) {
    const std::string_view trimmed = Trimmed(text);
    if (const auto value = ParseByKind(param, trimmed)) return {value, {}};
    std::string error;
    AppendName(error, param.name);
    error.append(" takes ").append(AllowedValues(param)).append(", not \"").append(trimmed).append("\"");
    return {std::nullopt, error};
}

std::string FormatShown(const ParamRow& param, ValueWord stored) {
    switch (param.kind) {
        case kKindSlider: {
            const double minimum = param.minimum;
            return NumberText(minimum + stored.number * (param.maximum - minimum));
        }
        case kKindColour: {
            char text[8];
            std::snprintf(text, sizeof text, "#%02X%02X%02X", stored.colour & 0xFFu,
                          stored.colour >> 8 & 0xFFu, stored.colour >> 16 & 0xFFu);
            return text;
        }
        case kKindMenu: {
            const auto item = static_cast<std::uint32_t>(stored.item);
            return item < param.items.size() ? param.items[item] : "";
        }
        case kKindCheckBox:
            return stored.flag != 0 ? "on" : "off";
        default:
            return {};
    }
}

}  // namespace velmora::effects

// The functions with which the effects' tables are written, and the code that converts them to the stored format. Presets
// and defaults are written as shown to the user, and settings are matched to parameters by name. All of it runs at compile
// time, so a mistake in a table (a missing column, a value out of range, an unknown name) does not compile.
#pragma once

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "effects/effect_table.h"

namespace velmora::effects::tables {

// Values of check boxes and of the "Pattern" menu, in defaults and presets.
enum Flag : std::uint32_t { kOff = 0, kOn = 1 };
using enum Pattern;

// ---------------------------------------------------------------------------------------------------------
// Parameters

consteval ValueWord StoredSlider(double shown, double minimum, double maximum) {
    if (shown < minimum || shown > maximum) throw "a slider's value lies outside its range";
    const double normalised = (shown - minimum) / (maximum - minimum);
    return {.bits = std::bit_cast<std::uint32_t>(static_cast<float>(normalised))};
}

consteval ParamRow Slider(const char* name, float minimum, float maximum, double shownDefault,
                          Layout layout) {
    return {name,   kKindSlider, minimum, maximum, StoredSlider(shownDefault, minimum, maximum),
            layout, false,       {},      0};
}

consteval ParamRow Colour(const char* name, std::uint32_t word, Layout layout) {
    return {name, kKindColour, 0.0f, 0.0f, {.bits = word}, layout, false, {}, 0};
}

consteval ParamRow CheckBox(const char* name, Flag flag, Layout layout) {
    return {name, kKindCheckBox, 0.0f, 0.0f, {.bits = flag}, layout, false, {}, 0};
}

consteval ParamRow Menu(const char* name, std::span<const char* const> items, Pattern chosen, Layout layout) {
    const auto item = static_cast<std::uint32_t>(chosen);
    if (items.size() > kMenuItemCapacity || item >= items.size()) throw "a menu's items or default are wrong";
    return {name, kKindMenu, 0.0f, 0.0f, {.bits = item}, layout, false, items, 0};
}

// `presetWord` fills the marker's cell in every preset. It has no meaning, but hosts have always seen it, so it stays.
consteval ParamRow GroupBegin(const char* name, std::uint32_t presetWord, Layout layout) {
    return {name, kKindGroup, 0.0f, 0.0f, {.bits = 0}, layout, false, {}, presetWord};
}

consteval ParamRow GroupEnd(const char* name, std::uint32_t presetWord, Layout layout) {
    return {name, kKindGroup, 0.0f, 0.0f, {.bits = 0}, layout, true, {}, presetWord};
}

// ---------------------------------------------------------------------------------------------------------
// Presets: one shown value for each parameter that holds one, in the parameters' order. A colour is its word
// 0x00BBGGRR, a menu its item, a check box kOff or kOn. A double holds all of them exactly.

template <std::size_t kValues>
struct PresetRow {
    const char* name;
    std::array<double, kValues> shown;
};

template <class... Value>
consteval PresetRow<sizeof...(Value)> Preset(const char* name, Value... shown) {
    return {name, {static_cast<double>(shown)...}};
}

consteval std::uint32_t StoredWord(double shown, double limit) {
    if (shown < 0.0 || shown >= limit) throw "a preset's value lies outside its range";
    const auto word = static_cast<std::uint32_t>(shown);
    if (static_cast<double>(word) != shown) throw "a preset's value is not a whole number";
    return word;
}

consteval ValueWord Stored(const ParamRow& param, double shown) {
    switch (param.kind) {
        case kKindSlider:
            return StoredSlider(shown, param.minimum, param.maximum);
        case kKindColour:
            return {.bits = StoredWord(shown, 4294967296.0)};
        case kKindMenu:
            return {.bits = StoredWord(shown, static_cast<double>(param.items.size()))};
        case kKindCheckBox:
            return {.bits = StoredWord(shown, 2.0)};
        default:
            throw "this parameter holds no value";
    }
}

template <std::size_t kParams, std::size_t kPresets, std::size_t kValues>
consteval std::array<PresetCell, kPresets * kParams> StorePresets(
    const ParamRow (&params)[kParams], const PresetRow<kValues> (&presets)[kPresets]) {
    std::array<PresetCell, kPresets * kParams> cells{};
    std::size_t cell = 0;
    for (const PresetRow<kValues>& preset : presets) {
        std::size_t value = 0;
        for (const ParamRow& param : params) {
            cells[cell].value = param.kind == kKindGroup ? ValueWord{.bits = param.groupWord}
                                                         : Stored(param, preset.shown.at(value++));
            cells[cell++].second = 0;
        }
        if (value != kValues) throw "a preset has more values than there are parameters";
    }
    return cells;
}

// The presets' names. Hosts show them in this order, so it must be alphabetical.
template <std::size_t kPresets, std::size_t kValues>
consteval std::array<const char*, kPresets> NamesOf(const PresetRow<kValues> (&presets)[kPresets]) {
    std::array<const char*, kPresets> names{};
    for (std::size_t i = 0; i < kPresets; ++i) {
        names[i] = presets[i].name;
        if (i > 0 && std::string_view(names[i - 1]) >= names[i]) throw "the presets are out of order";
    }
    return names;
}

// ---------------------------------------------------------------------------------------------------------
// The setting map. By default a setting is answered by the parameter with its name and kind, or else by its neutral
// value; only settings that are answered in another way have a row.

struct AnswerRow {
    Master master;
    MasterAnswer::Source source;
    const char* own;  // name of the own parameter
    std::uint32_t word;
    ParamKind kind;  // of a fixed value; kKindNone: as the setting's
};

consteval AnswerRow Own(Master master, const char* name) {
    return {master, MasterAnswer::Source::kOwn, name, 0, kKindNone};
}
consteval AnswerRow DepthOf(Master master, const char* name) {
    return {master, MasterAnswer::Source::kDepthOf, name, 0, kKindNone};
}
consteval AnswerRow Fixed(Master master, double normalised) {
    return {master, MasterAnswer::Source::kWord, nullptr, StoredSlider(normalised, 0.0, 1.0).bits,
            kKindSlider};
}
consteval AnswerRow FixedColour(Master master, std::uint32_t word) {
    return {master, MasterAnswer::Source::kWord, nullptr, word, kKindColour};
}
consteval AnswerRow Fixed(Master master, Flag flag) {
    return {master, MasterAnswer::Source::kFlag, nullptr, flag, kKindCheckBox};
}

consteval MasterAnswer NeutralAnswer(const MasterRow& row) {
    const std::uint32_t word = row.HostKind() == kKindSlider
                                   ? StoredSlider(row.neutral, row.minimum, row.maximum).bits
                                   : StoredWord(row.neutral, 4294967296.0);
    const auto source =
        row.HostKind() == kKindCheckBox ? MasterAnswer::Source::kFlag : MasterAnswer::Source::kWord;
    return {source, 0, {.bits = word}};
}

// Finds a parameter by name and kind together, as a colour and its amount may share a name. Returns the number of
// parameters when there is none.
consteval std::uint32_t OwnIndex(std::span<const ParamRow> params, ParamKind kind, std::string_view name) {
    std::uint32_t index = 0;
    while (index < params.size() && (params[index].kind != kind || params[index].name != name)) ++index;
    return index;
}

consteval MasterAnswer AnswerOf(const MasterRow& setting, std::span<const ParamRow> params,
                                std::span<const AnswerRow> rows) {
    for (const AnswerRow& row : rows) {
        if (row.master != setting.Setting()) continue;
        if (row.own == nullptr) {
            if (row.kind != setting.HostKind()) throw "a fixed value is of another kind";
            return {row.source, 0, {.bits = row.word}};
        }
        const std::uint32_t own = OwnIndex(params, setting.HostKind(), row.own);
        if (own == params.size()) throw "a setting names a parameter that the effect does not have";
        return {row.source, own, {}};
    }
    const std::uint32_t own = OwnIndex(params, setting.HostKind(), setting.name);
    if (own == params.size()) return NeutralAnswer(setting);
    return {MasterAnswer::Source::kOwn, own, {}};
}

consteval bool IsAsked(std::uint32_t param, std::span<const MasterAnswer> answers) {
    for (const MasterAnswer& answer : answers) {
        const bool isFixed =
            answer.source == MasterAnswer::Source::kWord || answer.source == MasterAnswer::Source::kFlag;
        if (!isFixed && answer.own == param) return true;
    }
    return false;
}

consteval std::array<MasterAnswer, kMasterCount> MapSettings(std::span<const ParamRow> params,
                                                             std::span<const AnswerRow> rows) {
    std::array<MasterAnswer, kMasterCount> answers{};
    std::size_t index = 0;
    for (const MasterRow& setting : kMasterRows) {
        if (setting.IsSetting()) answers[index++] = AnswerOf(setting, params, rows);
    }
    for (std::uint32_t param = 0; param < params.size(); ++param) {
        if (params[param].kind != kKindGroup && !IsAsked(param, answers))
            throw "a parameter answers no setting";
    }
    return answers;
}

}  // namespace velmora::effects::tables

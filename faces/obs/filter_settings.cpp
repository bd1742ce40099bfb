#include "faces/obs/filter_settings.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <optional>
#include <string_view>

#include "effects/effect_queries.h"

namespace velmora::hosts::obs {
namespace {

constexpr std::uint32_t kColourMask = 0x00FFFFFF;
constexpr std::uint32_t kOpaque = 0xFF000000;

float NormalisedNumber(const effects::ParamRow& row, double shown) {
    if (!(shown > row.minimum)) return 0.0f;  // also for NaN
    return static_cast<float>((std::min(shown, double{row.maximum}) - row.minimum) /
                              (double{row.maximum} - row.minimum));
}

// As typed: with the fewest digits that give the same stored number.
double ShownNumber(const effects::ParamRow& row, float normalised) {
    constexpr double kMostDigits = 1e9;
    const double exact = row.minimum + double{normalised} * (double{row.maximum} - row.minimum);
    for (double scale = 1.0; scale <= kMostDigits; scale *= 10.0) {
        const double shown = std::round(exact * scale) / scale;
        if (NormalisedNumber(row, shown) == normalised) return shown;
    }
    return exact;
}

ValueWord ReadOwn(const FilterDescription& filter, std::uint32_t param, obs_data_t* settings) {
    const effects::ParamRow& row = filter.effect.params[param];
    const char* key = filter.keys[param].c_str();
    switch (row.kind) {
        case kKindSlider:
            return {.number = NormalisedNumber(row, obs_data_get_double(settings, key))};
        case kKindColour:
            return {.colour = (static_cast<std::uint32_t>(obs_data_get_int(settings, key)) & kColourMask) |
                              (row.defaultValue.colour & ~kColourMask)};
        case kKindCheckBox:
            return {.bits = obs_data_get_bool(settings, key) ? 1u : 0u};
        case kKindMenu:
            return {.bits = effects::FindItem(row, obs_data_get_string(settings, key))
                                .value_or(row.defaultValue.count)};
        default:
            return {.bits = row.groupWord};
    }
}

bool IsSameValue(const effects::ParamRow& row, ValueWord a, ValueWord b) {
    switch (row.kind) {
        case kKindSlider:
            return a.number == b.number;
        case kKindColour:
            return ((a.colour ^ b.colour) & kColourMask) == 0;
        case kKindCheckBox:
            return a.flag == b.flag;
        case kKindMenu:
            return a.count == b.count;
        default:
            return true;
    }
}

std::optional<std::uint32_t> ChosenPreset(const FilterDescription& filter, obs_data_t* settings) {
    return effects::FindPreset(filter.effect, obs_data_get_string(settings, kPresetKey));
}

ValueWord PresetValue(const FilterDescription& filter, std::uint32_t preset, std::uint32_t param) {
    PresetCell cell{};
    static_cast<void>(effects::CopyPresetValue(filter.effect, preset, param, &cell));
    return cell.value;
}

}  // namespace

FilterDescription DescribeFilter(std::uint32_t index) {
    const effects::EffectTable& effect = *effects::kAllEffects[index];
    FilterDescription filter{.effect = effect,
                             .index = index,
                             .id = "velmora_" + effects::IdentifierOf(effect.name),
                             .name = std::string("Velmora ") + effect.name,
                             .keys = {},
                             .names = {}};
    for (const effects::ParamRow& row : effect.params) {
        filter.names.push_back(effects::HoldsValue(row) ? effects::UniqueName(effect, row) : row.name);
        filter.keys.push_back(effects::HoldsValue(row) ? effects::IdentifierOf(filter.names.back()) : "");
    }
    return filter;
}

void SetDefaults(const FilterDescription& filter, obs_data_t* settings) {
    for (std::uint32_t i = 0; i < filter.keys.size(); ++i) {
        const effects::ParamRow& row = filter.effect.params[i];
        const char* key = filter.keys[i].c_str();
        const ValueWord value = row.defaultValue;
        if (row.kind == kKindSlider) {
            obs_data_set_default_double(settings, key, ShownNumber(row, value.number));
        } else if (row.kind == kKindColour) {
            obs_data_set_default_int(settings, key, value.colour | kOpaque);
        } else if (row.kind == kKindCheckBox) {
            obs_data_set_default_bool(settings, key, value.flag != 0);
        } else if (row.kind == kKindMenu) {
            obs_data_set_default_string(settings, key, row.items[value.count]);
        }
    }
}

FilterValues ReadValues(const FilterDescription& filter, obs_data_t* settings) {
    FilterValues values;
    const long long seed = obs_data_get_int(settings, kSeedKey);
    constexpr long long kLargestSeed = std::numeric_limits<std::uint32_t>::max();
    values.seed = static_cast<std::uint32_t>(std::clamp(seed, 0LL, kLargestSeed));
    values.followsSource = obs_data_get_bool(settings, kSourceTimeKey);
    const auto preset = IsPresetPending(settings) ? ChosenPreset(filter, settings) : std::nullopt;
    for (std::uint32_t i = 0; i < filter.keys.size(); ++i) {
        values.own.push_back(preset ? PresetValue(filter, *preset, i) : ReadOwn(filter, i, settings));
    }
    return values;
}

void WriteValue(const FilterDescription& filter, std::uint32_t param, ValueWord value, obs_data_t* settings) {
    const effects::ParamRow& row = filter.effect.params[param];
    const char* key = filter.keys[param].c_str();
    if (row.kind == kKindSlider) {
        const float number = value.number > 0.0f ? std::min(value.number, 1.0f) : 0.0f;  // also for NaN
        obs_data_set_double(settings, key, ShownNumber(row, number));
    } else if (row.kind == kKindColour) {
        obs_data_set_int(settings, key, value.colour | kOpaque);
    } else if (row.kind == kKindCheckBox) {
        obs_data_set_bool(settings, key, value.flag != 0);
    } else if (row.kind == kKindMenu && value.count < row.items.size()) {
        obs_data_set_string(settings, key, row.items[value.count]);
    }
}

bool IsPresetPending(obs_data_t* settings) {
    return std::string_view(obs_data_get_string(settings, kPresetKey)) !=
           obs_data_get_string(settings, kAppliedPresetKey);
}

bool WriteChosenPreset(const FilterDescription& filter, obs_data_t* settings) {
    if (!IsPresetPending(settings)) return false;
    const auto preset = ChosenPreset(filter, settings);
    // The list in the panel knows a preset by its exact name; an unknown one leaves the values alone.
    const char* chosen = preset ? filter.effect.presetNames[*preset] : "";
    obs_data_set_string(settings, kPresetKey, chosen);
    obs_data_set_string(settings, kAppliedPresetKey, chosen);
    for (std::uint32_t i = 0; preset && i < filter.keys.size(); ++i) {
        WriteValue(filter, i, PresetValue(filter, *preset, i), settings);
    }
    return true;
}

void DropPresetIfChanged(const FilterDescription& filter, obs_data_t* settings) {
    const auto preset = ChosenPreset(filter, settings);
    if (!preset || IsPresetPending(settings)) return;
    for (std::uint32_t i = 0; i < filter.keys.size(); ++i) {
        const ValueWord own = ReadOwn(filter, i, settings);
        if (IsSameValue(filter.effect.params[i], own, PresetValue(filter, *preset, i))) continue;
        obs_data_set_string(settings, kPresetKey, "");
        obs_data_set_string(settings, kAppliedPresetKey, "");
        return;
    }
}

bool IsNeutral(const FilterDescription& filter, const FilterValues& values) {
    for (std::uint32_t i = 0; i < values.own.size(); ++i) {
        const effects::ParamRow& row = filter.effect.params[i];
        if (!IsSameValue(row, values.own[i], row.defaultValue)) return false;
    }
    return true;
}

}  // namespace velmora::hosts::obs

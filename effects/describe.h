// Effects, parameters, presets and values in the words that users read and type: what hosts with a command
// line or named controls need. Names are compared without regard to case.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "effects/effect_table.h"

namespace velmora::effects {

// Null when there is no such effect.
[[nodiscard]] const EffectTable* FindEffect(std::string_view name) noexcept;
[[nodiscard]] std::optional<std::uint32_t> FindPreset(const EffectTable& effect,
                                                      std::string_view name) noexcept;

// The name by which a parameter is told from the others of its effect: its own, or "Tint Color" for a colour
// that shares its name with its amount ("Tint"). Group markers keep their names, which are not unique.
[[nodiscard]] std::string ParamKey(const EffectTable& effect, std::uint32_t index);

// The parameter with this key that holds a value; with a kind, the one of this kind with this key or name.
[[nodiscard]] std::optional<std::uint32_t> FindParam(const EffectTable& effect, std::string_view name,
                                                     ParamKind kind = kKindNone);

// Which names there are, as a message lists them: "Film Camera", "Film Look", ...
[[nodiscard]] std::string ListEffects();
[[nodiscard]] std::string ListParams(const EffectTable& effect);
[[nodiscard]] std::string ListPresets(const EffectTable& effect);

// "slider", "color", "menu", "check box" or "group".
[[nodiscard]] std::string_view KindName(ParamKind kind) noexcept;

// Which values a parameter takes, as a message says it: a number from 0 to 10; a color #RRGGBB; one of
// Wavy, Blotchy, ...; on or off.
[[nodiscard]] std::string AllowedValues(const ParamRow& param);

struct ParsedValue {
    std::optional<ValueWord> value;  // stored form
    std::string error;               // a whole sentence without full stop, when there is no value
};

// A shown value: a number within the slider's range, #RRGGBB (with or without #), a menu item's text, on or
// off (also yes, no, true, false, 1, 0). Numbers have a decimal point whatever the locale.
[[nodiscard]] ParsedValue ParseShown(const ParamRow& param, std::string_view text);

// A stored value as the user sees it; numbers with up to 4 decimals. ParseShown reads it back. Empty for
// group markers and for menu items that do not exist.
[[nodiscard]] std::string FormatShown(const ParamRow& param, ValueWord stored);

}  // namespace velmora::effects

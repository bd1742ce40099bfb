// The names of parameters, presets and menu items for hosts that show or look up each by its name alone.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "effects/effect_table.h"

namespace velmora::effects {

// False for group markers.
[[nodiscard]] bool HoldsValue(const ParamRow& param) noexcept;

// The parameter's name, unique in its effect: where a colour and its amount share a name, " Colour" or " Amount" is
// added.
[[nodiscard]] std::string UniqueName(const EffectTable& effect, const ParamRow& param);

// "Film Pro" as a part of file names and identifiers: "film_pro".
[[nodiscard]] std::string IdentifierOf(std::string_view name);

// The preset or menu item of that name by the rule of text/names.h; nothing when there is none.
[[nodiscard]] std::optional<std::uint32_t> FindPreset(const EffectTable& effect, std::string_view name);
[[nodiscard]] std::optional<std::uint32_t> FindItem(const ParamRow& menu, std::string_view text);

}  // namespace velmora::effects

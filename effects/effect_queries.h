// Queries about an effect, answered from its table. Hosts reach them through the effect objects and the sessions; programs
// and plug-ins use them to show parameters, presets and menu items and to find them by name.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "effects/effect_table.h"
#include "api/host_api.h"

namespace velmora::effects {

// Describes parameter `index`: writes the fields of its kind and leaves all others as they are. False, with
// nothing written, past the last parameter or without a descriptor.
[[nodiscard]] bool DescribeParam(const EffectTable& effect, std::uint32_t index,
                                 ParamDescriptor* descriptor) noexcept;

// Null past the last preset.
[[nodiscard]] const char* PresetName(const EffectTable& effect, std::uint32_t preset) noexcept;

// False, with nothing written, when an index is past its end or `cell` is null.
[[nodiscard]] bool CopyPresetValue(const EffectTable& effect, std::uint32_t preset, std::uint32_t parameter,
                                   PresetCell* cell) noexcept;

// Answers the renderer's request for master setting `index` (0..20) according to the effect's table, with the effect's own
// parameters from `host`, and stores `kind` in the cell. False if `host` or `cell` is null (the cell is then unchanged), for
// other indices, and if the host has no answer.
[[nodiscard]] bool AnswerMaster(const EffectTable& effect, IVideoHost* host, std::uint32_t index,
                                ValueCell* cell, std::uint32_t kind);

// Names.

// False for group markers.
[[nodiscard]] bool HoldsValue(const ParamRow& param) noexcept;

// The parameter's name, unique in its effect: where a colour and its amount share a name, " Colour" or " Amount" is
// added.
[[nodiscard]] std::string UniqueName(const EffectTable& effect, const ParamRow& param);

// "Film Pro" as a part of file names and identifiers: "film_pro".
[[nodiscard]] std::string IdentifierOf(std::string_view name);

// The index of the preset or menu item with that name, matched as text/names.h says; nothing if there is none.
[[nodiscard]] std::optional<std::uint32_t> FindPreset(const EffectTable& effect, std::string_view name);
[[nodiscard]] std::optional<std::uint32_t> FindItem(const ParamRow& menu, std::string_view text);

}  // namespace velmora::effects

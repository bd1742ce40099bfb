// What a host can ask about an effect, answered from its table. Both the effect objects and the sessions use these.
#pragma once

#include <cstdint>

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

// Answers the renderer's request for master setting `index` (0..20) according to the effect's setting map, taking the
// effect's own parameters from `host`, and stores `kind` in the cell. False, with the cell untouched, without a host or
// a cell; also false for other indices and when the host has no answer.
[[nodiscard]] bool AnswerMaster(const EffectTable& effect, IVideoHost* host, std::uint32_t index,
                                ValueCell* cell, std::uint32_t kind);

}  // namespace velmora::effects

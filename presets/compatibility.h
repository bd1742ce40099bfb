// Whether a preset belongs to an effect.
#pragma once

#include <cstdint>
#include <span>

#include "api/host_api.h"

namespace velmora {

// True when the record's library and effect names are these, byte for byte, and its first values have the
// kinds of the effect's parameters, in their order. More values than parameters are accepted, fewer are not.
[[nodiscard]] bool IsCompatible(const char* libraryName, const char* effectName,
                                std::span<const std::uint32_t> kinds, const PresetRecord* record) noexcept;

// The same for effect `effectIndex` of a library. Without a library every preset with values fits; an effect
// that is not there, or a null record, fits nothing.
[[nodiscard]] bool IsCompatible(IEffectLibrary* library, std::uint32_t effectIndex,
                                const PresetRecord* record) noexcept;

}  // namespace velmora

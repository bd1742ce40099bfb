// Calls an interface's slots with the processor in any state, as hosts of other compilers and languages do.
#pragma once

#include <cstdint>
#include <initializer_list>

#include "api/host_api.h"

namespace velmora::reelcheck {

struct ProcessorState {
    std::uint16_t x87Control = 0x037F;
    std::uint32_t vectorControl = 0x1F80;
    bool isDownward = false;  // the direction of string operations

    bool operator==(const ProcessorState&) const = default;
};

struct RawResult {
    std::uintptr_t value = 0;
    ProcessorState after;    // control words without the sticky exception flags
    bool isX87Empty = true;  // no x87 register is left in use
};

// Calls the operation in `slot` of the object's table. Takes up to 6 words, including the object. `shift`: bytes by
// which the stack misses a multiple of 16, as far as the system allows it (0, 4, 8 or 12 on 32-bit Windows, else 0).
[[nodiscard]] RawResult CallSlot(void* object, std::uint32_t slot,
                                 std::initializer_list<std::uintptr_t> arguments, const ProcessorState& state,
                                 std::uint32_t shift = 0);
// The same for a function exported by the library.
[[nodiscard]] RawResult CallFunction(void* function, std::initializer_list<std::uintptr_t> words,
                                     const ProcessorState& state, std::uint32_t shift = 0);

// Whether callers on this system may have a stack that misses a multiple of 16.
[[nodiscard]] bool MayShiftStack() noexcept;

inline std::uintptr_t WordOf(const void* pointer) noexcept {
    return reinterpret_cast<std::uintptr_t>(pointer);
}

}  // namespace velmora::reelcheck

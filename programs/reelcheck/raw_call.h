// Calls to an interface's slots with the processor in any state, as hosts of other compilers and languages make them.
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
    ProcessorState after;    // control words without the bits that tell of past exceptions
    bool isX87Empty = true;  // no register of the x87 is left in use
};

// Calls the operation in `slot` of the object's table. Up to 6 words, the object included. `shift`: bytes by which
// the stack misses a multiple of 16, as far as the system allows it (0, 4, 8 or 12 on 32-bit Windows, else 0).
[[nodiscard]] RawResult CallSlot(void* object, std::uint32_t slot,
                                 std::initializer_list<std::uintptr_t> arguments, const ProcessorState& state,
                                 std::uint32_t shift = 0);
// Likewise a function, an export of the library.
[[nodiscard]] RawResult CallFunction(void* function, std::initializer_list<std::uintptr_t> words,
                                     const ProcessorState& state, std::uint32_t shift = 0);

// Whether a stack that misses a multiple of 16 is something the system's callers may come with.
[[nodiscard]] bool MayShiftStack() noexcept;

inline std::uintptr_t WordOf(const void* pointer) noexcept {
    return reinterpret_cast<std::uintptr_t>(pointer);
}

}  // namespace velmora::reelcheck

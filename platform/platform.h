// The few things that the library needs from the operating system besides its dialogs. One implementation per system:
// platform_win32.cpp, platform_posix.cpp.
#pragma once

#include <cstdint>
#include <string>

namespace velmora::support {

// Milliseconds since the system started, modulo 2^32.
[[nodiscard]] std::uint32_t TickCount() noexcept;

// A number of the calling thread; never 0. Ended threads' numbers are used again.
[[nodiscard]] std::uintptr_t ThreadId() noexcept;

// A module of the system's loader; null for none.
using ModuleHandle = void*;

// The module that this code is linked into; null in a native program, which does not need it to find its files.
[[nodiscard]] ModuleHandle OwnModule() noexcept;
// Loads a module by path or bare name (16-bit text); null when it cannot be loaded.
[[nodiscard]] ModuleHandle LoadModule(const char16_t* name) noexcept;
void UnloadModule(ModuleHandle module) noexcept;
// The address of an export, or null.
[[nodiscard]] void* FindExport(ModuleHandle module, const char* name) noexcept;
// The folder of a module with its trailing separator; null means the running program's. Empty when it is unknown or
// there is not enough memory.
[[nodiscard]] std::u16string ModuleFolder(ModuleHandle module) noexcept;

// The language that the user reads, as the two lower-case letters of ISO 639; "en" when unknown.
[[nodiscard]] std::string UserLanguage();

// The path of the module that holds a code address, in the system's 8-bit text; empty when unknown.
[[nodiscard]] std::string ModuleAt(const void* address);

}  // namespace velmora::support

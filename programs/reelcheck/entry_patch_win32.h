// Replaces a function that a system module exports, for modules that are loaded afterwards.
#pragma once

#include <windows.h>

#include <cstdint>
#include <cstring>
#include <stdexcept>
#include <string>

namespace velmora::reelcheck {

// Where the module's table holds an export's offset; null when there is no such name.
inline DWORD* ExportEntry(std::uint8_t* base, const char* wanted) {
    const auto* const dos = reinterpret_cast<const IMAGE_DOS_HEADER*>(base);
    const auto* const headers = reinterpret_cast<const IMAGE_NT_HEADERS32*>(base + dos->e_lfanew);
    const IMAGE_DATA_DIRECTORY& place = headers->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_EXPORT];
    const auto* const exports = reinterpret_cast<const IMAGE_EXPORT_DIRECTORY*>(base + place.VirtualAddress);
    const auto* const names = reinterpret_cast<const DWORD*>(base + exports->AddressOfNames);
    const auto* const ordinals = reinterpret_cast<const WORD*>(base + exports->AddressOfNameOrdinals);
    for (DWORD i = 0; i < exports->NumberOfNames; ++i) {
        if (std::strcmp(reinterpret_cast<const char*>(base + names[i]), wanted) != 0) continue;
        return reinterpret_cast<DWORD*>(base + exports->AddressOfFunctions) + ordinals[i];
    }
    return nullptr;
}

// Returns the module's own function. Throws std::runtime_error when there is no such export. 32-bit only: a table
// entry is an offset from the module, which reaches every address there.
inline void* ReplaceExport(const wchar_t* module, const char* name, void* replacement) {
    auto* const base =
        reinterpret_cast<std::uint8_t*>(LoadLibraryW(module));  // never freed: others hold its functions
    DWORD* const entry = base != nullptr ? ExportEntry(base, name) : nullptr;
    DWORD protection = 0;
    if (entry == nullptr || !VirtualProtect(entry, sizeof *entry, PAGE_READWRITE, &protection)) {
        throw std::runtime_error(std::string("no export ") + name + " to replace");
    }
    void* const own = reinterpret_cast<void*>(GetProcAddress(reinterpret_cast<HMODULE>(base), name));
    *entry = reinterpret_cast<DWORD>(replacement) - reinterpret_cast<DWORD>(base);
    VirtualProtect(entry, sizeof *entry, protection, &protection);
    return own;
}

template <typename Function>
Function ReplaceExport(const wchar_t* module, const char* name, Function replacement) {
    return reinterpret_cast<Function>(ReplaceExport(module, name, reinterpret_cast<void*>(replacement)));
}

}  // namespace velmora::reelcheck

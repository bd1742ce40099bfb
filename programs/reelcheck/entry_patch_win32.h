// Replaces a function that a system module exports, for modules that are loaded afterwards.
#pragma once

namespace velmora::reelcheck {

// Returns the module's own function. Throws std::runtime_error when there is no such export. 32-bit only: a table
// entry is an offset from the module, which reaches every address there.
void* ReplaceExport(const wchar_t* module, const char* name, void* replacement);

template <typename Function>
Function ReplaceExport(const wchar_t* module, const char* name, Function replacement) {
    return reinterpret_cast<Function>(ReplaceExport(module, name, reinterpret_cast<void*>(replacement)));
}

}  // namespace velmora::reelcheck

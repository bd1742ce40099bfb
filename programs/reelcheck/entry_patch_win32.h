// Another function in place of one that a system module exports, for modules that are loaded from then on.
#pragma once

namespace velmora::reelcheck {

// Returns the module's own function. Throws std::runtime_error when there is no such export. 32-bit only: an entry of
// the table is an offset from the module, which there reaches every address.
void* ReplaceExport(const wchar_t* module, const char* name, void* replacement);

template <typename Function>
Function ReplaceExport(const wchar_t* module, const char* name, Function replacement) {
    return reinterpret_cast<Function>(ReplaceExport(module, name, reinterpret_cast<void*>(replacement)));
}

}  // namespace velmora::reelcheck

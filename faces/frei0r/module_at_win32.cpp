#include <windows.h>

#include "faces/frei0r/host_time_unit.h"

namespace velmora::hosts::frei0r {

std::string ModuleAt(const void* address) {
    constexpr DWORD kFlags =
        GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT;
    HMODULE module = nullptr;
    if (GetModuleHandleExA(kFlags, static_cast<const char*>(address), &module) == 0) return "";
    // Only the file name matters, and the names to be found are ASCII.
    char path[MAX_PATH * 4];
    return std::string(path, GetModuleFileNameA(module, path, sizeof(path)));
}

}  // namespace velmora::hosts::frei0r

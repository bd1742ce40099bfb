#include <windows.h>

#include "platform/platform.h"

namespace velmora::support {
namespace {

// Windows' 16-bit text is wchar_t; the library's is char16_t. Both are UTF-16.
static_assert(sizeof(wchar_t) == sizeof(char16_t));
const wchar_t* Wide(const char16_t* text) noexcept {
    return reinterpret_cast<const wchar_t*>(text);
}

// The longest path that the system handles.
constexpr DWORD kLongestPath = 32768;

}  // namespace

std::uint32_t TickCount() noexcept {
    return GetTickCount();
}

ModuleHandle LoadModule(const char16_t* name) noexcept {
    return LoadLibraryW(Wide(name));
}

void UnloadModule(ModuleHandle module) noexcept {
    FreeLibrary(static_cast<HMODULE>(module));
}

void* FindExport(ModuleHandle module, const char* name) noexcept {
    return reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(module), name));
}

std::u16string ModuleFolder(ModuleHandle module) noexcept try {
    std::u16string path;
    for (DWORD room = MAX_PATH; room <= kLongestPath; room *= 2) {
        path.resize(room);
        const DWORD length =
            GetModuleFileNameW(static_cast<HMODULE>(module), reinterpret_cast<wchar_t*>(path.data()), room);
        if (length == 0) return {};
        if (length == room) continue;  // cut
        path.resize(length);
        path.resize(path.find_last_of(u"/\\") + 1);
        return path;
    }
    return {};
} catch (...) {
    return {};
}

}  // namespace velmora::support

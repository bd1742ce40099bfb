#include <windows.h>

#include "platform/platform.h"
#include "platform/win32.h"

namespace velmora::support {
namespace {

// The longest path that the system supports.
constexpr DWORD kLongestPath = 32768;

HMODULE Holding(const void* address) noexcept {
    HMODULE module = nullptr;
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       static_cast<const wchar_t*>(address), &module);
    return module;
}

}  // namespace

std::uint32_t TickCount() noexcept {
    return GetTickCount();
}

std::uintptr_t ThreadId() noexcept {
    return GetCurrentThreadId();
}

ModuleHandle OwnModule() noexcept {
    return Holding(reinterpret_cast<const void*>(&OwnModule));
}

ModuleHandle LoadModule(const char16_t* name) noexcept {
    return LoadLibraryW(win32::Wide(name));
}

void UnloadModule(ModuleHandle module) noexcept {
    FreeLibrary(static_cast<HMODULE>(module));
}

void* FindExport(ModuleHandle module, const char* name) noexcept {
    return reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(module), name));
}

std::u16string ModuleFolder(ModuleHandle module) noexcept try {
    std::u16string path;
    for (DWORD capacity = MAX_PATH; capacity <= kLongestPath; capacity *= 2) {
        path.resize(capacity);
        const DWORD length = GetModuleFileNameW(static_cast<HMODULE>(module),
                                                reinterpret_cast<wchar_t*>(path.data()), capacity);
        if (length == 0) return {};
        if (length == capacity) continue;  // truncated
        path.resize(length);
        path.resize(path.find_last_of(u"/\\") + 1);
        return path;
    }
    return {};
} catch (...) {
    return {};
}

std::string UserLanguage() {
    char code[9] = {};
    const LCID locale = MAKELCID(GetUserDefaultUILanguage(), SORT_DEFAULT);
    return GetLocaleInfoA(locale, LOCALE_SISO639LANGNAME, code, sizeof code) == 3 ? code : "en";
}

std::string ModuleAt(const void* address) {
    const HMODULE module = Holding(address);
    if (module == nullptr) return "";
    char path[MAX_PATH * 4];
    return {path, GetModuleFileNameA(module, path, sizeof path)};
}

}  // namespace velmora::support

#include <dlfcn.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <system_error>

#include "platform/platform.h"

namespace velmora::support {

std::uint32_t TickCount() noexcept {
    const auto now = std::chrono::steady_clock::now().time_since_epoch();
    return static_cast<std::uint32_t>(std::chrono::duration_cast<std::chrono::milliseconds>(now).count());
}

std::uintptr_t ThreadId() noexcept {
    thread_local char own = 0;
    return reinterpret_cast<std::uintptr_t>(&own);
}

ModuleHandle OwnModule() noexcept {
    return nullptr;
}

ModuleHandle LoadModule(const char16_t* name) noexcept try {
    return dlopen(std::filesystem::path(name).c_str(), RTLD_NOW | RTLD_LOCAL);
} catch (...) {
    return nullptr;
}

void UnloadModule(ModuleHandle module) noexcept {
    if (module != nullptr) dlclose(module);
}

void* FindExport(ModuleHandle module, const char* name) noexcept {
    return dlsym(module, name);
}

// The native library is linked into its program, so every module's folder is the program's.
std::u16string ModuleFolder(ModuleHandle) noexcept try {
    std::error_code error;
    const std::filesystem::path program = std::filesystem::read_symlink("/proc/self/exe", error);
    return error ? std::u16string() : (program.parent_path() / "").u16string();
} catch (...) {
    return {};
}

std::string UserLanguage() {
    for (const char* name : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
        const char* const value = std::getenv(name);
        if (value == nullptr || *value == 0) continue;
        const std::string locale = value;
        const auto isLetter = [](char c) { return c >= 'a' && c <= 'z'; };
        if (locale.size() >= 2 && isLetter(locale[0]) && isLetter(locale[1])) return locale.substr(0, 2);
        break;
    }
    return "en";
}

std::string ModuleAt(const void* address) {
    Dl_info info{};
    return dladdr(address, &info) != 0 && info.dli_fname != nullptr ? info.dli_fname : "";
}

}  // namespace velmora::support

#include <dlfcn.h>
#include <unistd.h>

#include <chrono>

#include "support/platform.h"

namespace velmora::support {
namespace {

std::string Narrow8(const char16_t* text) {
    std::string out;
    for (; *text != 0; ++text) {
        char32_t c = *text;
        if (c >= 0xD800 && c < 0xDC00 && text[1] >= 0xDC00 && text[1] < 0xE000) {
            c = 0x10000 + ((c - 0xD800) << 10) + (*++text - char32_t{0xDC00});
        }
        const auto add = [&out](char32_t byte) { out.push_back(static_cast<char>(byte)); };
        if (c < 0x80) {
            add(c);
        } else if (c < 0x800) {
            add(0xC0 | c >> 6), add(0x80 | (c & 0x3F));
        } else if (c < 0x10000) {
            add(0xE0 | c >> 12), add(0x80 | (c >> 6 & 0x3F)), add(0x80 | (c & 0x3F));
        } else {
            add(0xF0 | c >> 18), add(0x80 | (c >> 12 & 0x3F)), add(0x80 | (c >> 6 & 0x3F));
            add(0x80 | (c & 0x3F));
        }
    }
    return out;
}

}  // namespace

std::uint32_t TickCount() noexcept {
    const auto now = std::chrono::steady_clock::now().time_since_epoch();
    return static_cast<std::uint32_t>(std::chrono::duration_cast<std::chrono::milliseconds>(now).count());
}

ModuleHandle LoadModule(const char16_t* name) noexcept try {
    return dlopen(Narrow8(name).c_str(), RTLD_NOW | RTLD_LOCAL);
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
    char path[4096];
    const ssize_t length = readlink("/proc/self/exe", path, sizeof path);
    if (length <= 0) return {};
    std::string folder(path, static_cast<std::size_t>(length));
    folder.resize(folder.find_last_of('/') + 1);
    return std::u16string(folder.begin(), folder.end());
} catch (...) {
    return {};
}

}  // namespace velmora::support

#include "desktop/preferences.h"

#include <windows.h>

#include <cstring>

#include "platform/win32.h"

namespace velmora::support {
namespace {

constexpr char kSection[] = "Common";
constexpr char kKnobsSetting[] = "Knobs Drag Vertical";
constexpr DWORD kLongestText = 1024;  // bytes, with the terminator

std::string KeyPath(const char* section) {
    return std::string("Software\\Velmora\\") + section;
}

std::optional<std::string> ReadText(HKEY root, const std::string& path, const char* name) {
    HKEY opened = nullptr;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &opened) != ERROR_SUCCESS) return {};
    const win32::RegistryKey key(opened);
    char text[kLongestText + 1] = {};  // one extra: a stored text need not be terminated
    DWORD type = REG_NONE;
    DWORD size = kLongestText;
    const LSTATUS status =
        RegQueryValueExA(key.get(), name, nullptr, &type, reinterpret_cast<BYTE*>(text), &size);
    if (status != ERROR_SUCCESS || type != REG_SZ) return {};
    return std::string(text);
}

}  // namespace

void Preferences::Read() noexcept try {
    const std::optional<std::string> knobs = ReadSetting(kSection, kKnobsSetting);
    m_knobsDragVertical = knobs && knobs->starts_with('y');
} catch (...) {
    m_knobsDragVertical = false;  // not enough memory
}

void Preferences::SetKnobsDragVertical(bool vertical) noexcept try {
    m_knobsDragVertical = vertical;
    WriteSetting(kSection, kKnobsSetting, vertical ? "yes" : "no");
} catch (...) {
    // Not enough memory: treated as if the registry had refused.
}

std::optional<std::string> ReadSetting(const char* section, const char* name) {
    const std::string path = KeyPath(section);
    std::optional<std::string> text = ReadText(HKEY_CURRENT_USER, path, name);
    return text ? text : ReadText(HKEY_LOCAL_MACHINE, path, name);
}

bool WriteSetting(const char* section, const char* name, const char* text) {
    HKEY opened = nullptr;
    if (RegCreateKeyExA(HKEY_CURRENT_USER, KeyPath(section).c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE,
                        KEY_ALL_ACCESS, nullptr, &opened, nullptr) != ERROR_SUCCESS) {
        return false;
    }
    const win32::RegistryKey key(opened);
    return RegSetValueExA(key.get(), name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text),
                          static_cast<DWORD>(std::strlen(text) + 1)) == ERROR_SUCCESS;
}

}  // namespace velmora::support

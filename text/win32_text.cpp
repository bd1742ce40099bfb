#include "text/win32_text.h"

#include <windows.h>

#include "text/code_page.h"

namespace velmora::support::win32 {
namespace {

std::u16string ExistingShortPath(const std::u16string& path) {
    const DWORD room = GetShortPathNameW(Wide(path.c_str()), nullptr, 0);
    if (room == 0) return {};
    std::u16string shortPath(room, u'\0');
    const DWORD length =
        GetShortPathNameW(Wide(path.c_str()), reinterpret_cast<wchar_t*>(shortPath.data()), room);
    if (length == 0 || length >= room) return {};
    shortPath.resize(length);
    return shortPath;
}

}  // namespace

std::u16string Widen(const std::string& text) {
    const auto size = static_cast<std::uint32_t>(text.size());
    std::u16string wide(text.size(), u'\0');  // no 8-bit code page needs more
    wide.resize(WidenText(text.data(), size, wide.data(), size));
    return wide;
}

std::optional<std::string> ExactNarrow(const std::u16string& text) {
    if (text.empty()) return std::string();
    // A UTF-8 code page represents everything and takes neither the flag nor the report.
    const bool utf8 = GetACP() == CP_UTF8;
    const DWORD flags = utf8 ? 0 : WC_NO_BEST_FIT_CHARS;
    BOOL replaced = FALSE;
    BOOL* const report = utf8 ? nullptr : &replaced;
    const int length = static_cast<int>(text.size());
    std::string narrow(text.size() * 4, '\0');
    const int size = WideCharToMultiByte(CP_ACP, flags, Wide(text.c_str()), length, narrow.data(),
                                         static_cast<int>(narrow.size()), nullptr, report);
    if (size == 0 || replaced != FALSE) return {};
    narrow.resize(static_cast<std::size_t>(size));
    return narrow;
}

std::u16string ShortPath(const std::u16string& path) {
    if (std::u16string found = ExistingShortPath(path); !found.empty()) return found;
    const std::size_t nameStart = path.find_last_of(u"/\\") + 1;
    std::u16string folder = ExistingShortPath(path.substr(0, nameStart));
    return folder.empty() ? folder : folder + path.substr(nameStart);
}

}  // namespace velmora::support::win32

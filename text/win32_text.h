// Text at the edge to Windows: its wchar_t is the library's char16_t, both UTF-16; 8-bit text is in the system
// code page.
#pragma once

#include <optional>
#include <string>

namespace velmora::support::win32 {

static_assert(sizeof(wchar_t) == sizeof(char16_t));
inline const wchar_t* Wide(const char16_t* text) noexcept {
    return reinterpret_cast<const wchar_t*>(text);
}

// 8-bit text as 16-bit; empty when the system cannot convert it.
[[nodiscard]] std::u16string Widen(const std::string& text);

// 16-bit text as 8-bit, nothing when a character has no exact 8-bit form: a look-alike would name another file.
[[nodiscard]] std::optional<std::string> ExactNarrow(const std::u16string& text);

// The short path of a file. When the file is missing, its folder's short path with the file's own name; empty when
// the folder has none.
[[nodiscard]] std::u16string ShortPath(const std::u16string& path);

}  // namespace velmora::support::win32

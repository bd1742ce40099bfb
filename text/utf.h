// Unicode text: UTF-8 as language files have it, and 16-bit text in the buffers of callers. Well-formed UTF-8 has no overlong forms, no surrogates, no values past U+10FFFF and
// no sequences cut short.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace velmora::language {

bool IsUtf8(std::string_view text) noexcept;

// Nothing when `text` is not well-formed. Throws std::bad_alloc.
std::optional<std::u16string> Utf16FromUtf8(std::string_view text);

// Copies the zero-terminated `text` (null counts as empty) into `buffer`, which holds `capacity` characters:
// always terminated, cut where it does not fit, never inside a surrogate pair. Not more than `capacity`
// characters of the text are read. Returns the characters written without the terminator; a null buffer or a
// capacity below 1 gives 0 and nothing is touched.
std::int32_t CopyText(const char16_t* text, char16_t* buffer, std::int32_t capacity) noexcept;

}  // namespace velmora::language

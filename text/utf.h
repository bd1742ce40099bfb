// Unicode text: UTF-8 as in language files, and 16-bit text in callers' buffers. Well-formed UTF-8 has no overlong
// sequences, no surrogates, no values past U+10FFFF and no truncated sequences.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace velmora::language {

bool IsUtf8(std::string_view text) noexcept;

// Nothing when `text` is not well-formed. Throws std::bad_alloc.
std::optional<std::u16string> Utf16FromUtf8(std::string_view text);

// Copies the zero-terminated `text` (null counts as empty) into `buffer`, which holds `capacity` characters: always
// terminated, truncated where it does not fit, never inside a surrogate pair. Reads at most `capacity` characters of
// the text. Returns the characters written without the terminator; a null buffer or a capacity below 1 returns 0 and
// nothing is written.
std::int32_t CopyText(const char16_t* text, char16_t* buffer, std::int32_t capacity) noexcept;

}  // namespace velmora::language

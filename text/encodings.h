// Conversions between kinds of text: 8-bit text in the system code page, UTF-8, 16-bit text. All that the project has are
// here.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace velmora {

// The system code page. On Windows this is the system's default code page for 8-bit text. Other systems have none: names
// in preset files come from Windows machines, so they are read as Windows-1252.

// What differs between systems (code_page_win32.cpp, code_page_posix.cpp).
//
// Converts `length` bytes of system code page text. Returns the number of 16-bit characters needed, and writes them
// when `buffer` is not null. 0 after any failure: nothing to convert, or a buffer of `capacity` characters that is too
// small.
[[nodiscard]] std::uint32_t WidenText(const char* text, std::uint32_t length, char16_t* buffer,
                                      std::uint32_t capacity) noexcept;
// Converts `length` characters to bytes. Returns the number of bytes; 0 after any failure: nothing to convert, a
// character without an exact 8-bit equivalent (a look-alike would name another file), or a buffer of `capacity` bytes
// that is too small.
[[nodiscard]] std::uint32_t NarrowText(const char16_t* text, std::uint32_t length, char* buffer,
                                       std::uint32_t capacity) noexcept;

// The same with strings. Both throw std::bad_alloc. When the text cannot be converted, Widen returns an empty string
// and NarrowExactly returns nothing.
[[nodiscard]] std::u16string Widen(std::string_view text);
[[nodiscard]] std::optional<std::string> NarrowExactly(std::u16string_view text);

// Converts a file name to its exact 8-bit equivalent, one byte for each 16-bit character, terminated. False when the
// name has none (a character is not in the code page, would be replaced by a look-alike, or takes two bytes), when it
// is empty, or when `capacity` bytes are too few.
[[nodiscard]] bool NarrowFileName(const char16_t* name, char* buffer, std::uint32_t capacity) noexcept;

// UTF-8, as in language files. Well-formed UTF-8 has no overlong sequences, no surrogates, no values past U+10FFFF and no
// truncated sequences.

[[nodiscard]] bool IsUtf8(std::string_view text) noexcept;

// Nothing when `text` is not well-formed. Throws std::bad_alloc.
[[nodiscard]] std::optional<std::u16string> Utf16FromUtf8(std::string_view text);

// Copies the zero-terminated 16-bit `text` (null counts as empty) into `buffer`, which holds `capacity` characters: always
// terminated, truncated where it does not fit, never inside a surrogate pair. Reads at most `capacity` characters of
// the text. Returns the characters written without the terminator; a null buffer or a capacity below 1 returns 0 and
// nothing is written.
std::int32_t CopyText(const char16_t* text, char16_t* buffer, std::int32_t capacity) noexcept;

}  // namespace velmora

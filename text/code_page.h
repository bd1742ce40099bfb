// 8-bit and 16-bit text: the system code page. All conversions between the two are here.
//
// On Windows this is the system's default code page for 8-bit text. Other systems have none: names in preset files come
// from Windows machines, so they are read as Windows-1252.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace velmora {

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

}  // namespace velmora

// 8-bit and 16-bit text: the system code page.
//
// On Windows this is the system's default code page for 8-bit text. Elsewhere there is none: names in preset
// files come from Windows machines, so they are taken for Windows-1252.
#pragma once

#include <cstdint>

namespace velmora {

// Converts `length` bytes of system code page text. Returns the number of 16-bit characters that the text
// needs; they are written when `buffer` is not null. 0 after any failure: nothing to convert, or a buffer of
// `capacity` characters that is too small.
[[nodiscard]] std::uint32_t WidenText(const char* text, std::uint32_t length, char16_t* buffer,
                                      std::uint32_t capacity) noexcept;

// Converts a file name to its exact 8-bit form, one byte for each 16-bit character, terminated. False when
// the name has no such form (a character that is not in the code page, that would be replaced by a
// look-alike, or that takes two bytes), when it is empty, or when `capacity` bytes are too few.
[[nodiscard]] bool NarrowFileName(const char16_t* name, char* buffer, std::uint32_t capacity) noexcept;

}  // namespace velmora

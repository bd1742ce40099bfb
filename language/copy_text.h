// The one rule by which texts are written into buffers of a caller.
#pragma once

#include <cstdint>

namespace velmora::language {

// Copies the zero-terminated `text` (null counts as empty) into `buffer`, which holds `capacity` characters:
// always terminated, cut where it does not fit, never inside a surrogate pair. Not more than `capacity`
// characters of the text are read. Returns the characters written without the terminator; a null buffer or a
// capacity below 1 gives 0 and nothing is touched.
std::int32_t CopyText(const char16_t* text, char16_t* buffer, std::int32_t capacity) noexcept;

}  // namespace velmora::language

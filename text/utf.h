// The language file's text. Well-formed UTF-8 has no overlong forms, no surrogates, no values past U+10FFFF and
// no sequences cut short.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace velmora::language {

bool IsUtf8(std::string_view text) noexcept;

// Nothing when `text` is not well-formed. Throws std::bad_alloc.
std::optional<std::u16string> Utf16FromUtf8(std::string_view text);

}  // namespace velmora::language

// Strict conversion of the language file's text.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace velmora::language {

// Nothing when `text` is not well-formed UTF-8 (overlong forms, surrogates, values past U+10FFFF, a sequence
// cut short). Throws std::bad_alloc.
std::optional<std::u16string> Utf16FromUtf8(std::string_view text);

}  // namespace velmora::language

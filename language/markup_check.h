// Checks a language file before it is parsed into a tree.
//
// The tree parser is recursive, trusts the first byte of a UTF-8 sequence for its length (even past the file's end),
// stops at the first zero byte, and lets through what it does not understand (unknown entities, declarations, text
// after the root). A file that passes here is simple enough that the tree holds exactly what the file says and the
// parser does not overflow the stack.
#pragma once

#include <string_view>

namespace velmora::language {

// Maximum depth of nested elements; the format needs 4.
inline constexpr int kDeepestElement = 8;

// True when the file is well-formed UTF-8 and consists only of an optional byte order mark, an optional XML
// declaration, comments, one root element, elements nested up to kDeepestElement, text within elements, and references
// to the five predefined entities or to characters by number. Attribute values contain neither '<' nor '>'. The names
// of start and end tags are not compared here: the tree parser does that.
bool IsPlainMarkup(std::string_view file) noexcept;

}  // namespace velmora::language

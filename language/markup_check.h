// A look at a language file before it is parsed into a tree.
//
// The tree parser works recursively, trusts the first byte of a UTF-8 sequence about its length (even past the
// file's end), stops at the first zero byte, and lets pass what it does not understand (unknown entities,
// declarations, text behind the root). A file that passes here is plain enough for the
// tree to hold exactly what the file says, and for the stack to hold the parser.
#pragma once

#include <string_view>

namespace velmora::language {

// Elements may lie this deep in each other; the format needs 4.
inline constexpr int kDeepestElement = 8;

// True when the file is well-formed UTF-8 and made of nothing but an optional byte order mark, an optional XML declaration,
// comments, elements within elements up to kDeepestElement, one element at the root, text within elements,
// and references to the five predefined entities or to characters by number. Attribute values contain neither
// '<' nor '>'. Names are not compared: that comes with the tree.
bool IsPlainMarkup(std::string_view file) noexcept;

}  // namespace velmora::language

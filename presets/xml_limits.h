// Keeps hostile XML away from the parser, which recurses once per level, searches an element's attributes one by one
// and builds a tree of everything it reads.
#pragma once

namespace velmora {

inline constexpr int kXmlDepthLimit = 64;      // nested elements
inline constexpr int kXmlAttributeLimit = 64;  // attributes of one element
inline constexpr int kXmlNodeLimit = 500'000;  // elements, texts, comments and the like

// Scans a zero-terminated document in one pass, without allocating, by the lexical rules of the XML library. False when
// a limit is exceeded or when the parser would stop with an error. A document that passes may still contain one (an end
// tag with another name, a repeated attribute, a bad entity).
[[nodiscard]] bool IsWithinXmlLimits(const char* document) noexcept;

}  // namespace velmora

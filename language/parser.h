// The object behind LangXMLParser.
#pragma once

#include "language/lang_parser.h"

namespace velmora::language {

// A new parser without texts, with one reference that belongs to the caller; null when memory is short.
LangXMLParser* CreateParser() noexcept;

// True when every parser has been released.
bool NoParserIsAlive() noexcept;

}  // namespace velmora::language

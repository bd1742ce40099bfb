// Files of presets: read whole, replaced whole.
//
// File names are 8-bit text: in the system code page on Windows, bytes as they are (UTF-8) elsewhere.
#pragma once

#include <cstdio>
#include <functional>
#include <string>

namespace velmora {

// The whole file; false when it cannot be read, is empty or is longer than `limit` bytes (no more than that
// is ever read, also from a file that grows or that has no length).
[[nodiscard]] bool ReadWholeFile(const char* fileName, std::size_t limit, std::string* content);

// Writes text into a stream; false gives up.
using TextWriter = std::function<bool(std::FILE*)>;

// Replaces or creates a file by what `write` writes, with the platform's line ends. It is written beside and
// renamed when it is complete, so that an existing file is kept whole after any failure. Where that is not
// possible (the folder takes no new files, the name is no plain file's) it is written in place. False after any
// failure; a file that was written in place may then be incomplete.
[[nodiscard]] bool ReplaceTextFile(const char* fileName, const TextWriter& write);

}  // namespace velmora

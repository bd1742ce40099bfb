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

// What the above is made of: the few file operations that differ between systems (file_system_win32.cpp,
// file_system_posix.cpp).

#ifdef _WIN32
using NativePath = std::wstring;
#else
using NativePath = std::string;
#endif

// The path that an 8-bit name stands for, past any link to another file; false when there is none.
[[nodiscard]] bool MakeNativePath(const char* fileName, NativePath* path);

// Binary, for reading; null when it cannot be opened, or is a folder or a device.
[[nodiscard]] std::FILE* OpenForReading(const NativePath& path);
// As text, emptied; null when it cannot be opened or is write-protected.
[[nodiscard]] std::FILE* OpenForWriting(const NativePath& path);

// Creates a new file in the folder of `path`, under a name of its own, opened for writing text. Null when the
// folder takes none, and when `path` is there but is not a plain file or must not be written.
[[nodiscard]] std::FILE* CreateBeside(const NativePath& path, NativePath* beside);
// Puts `beside` in the place of `path`, also when that exists; then `beside` is gone.
[[nodiscard]] bool RenameOver(const NativePath& beside, const NativePath& path);
void Remove(const NativePath& path);

}  // namespace velmora

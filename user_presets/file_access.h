// Preset file access: a file is read whole or replaced whole.
//
// File names are 8-bit text: in the system code page on Windows, bytes as they are (UTF-8) elsewhere.
#pragma once

#include <cstdio>
#include <functional>
#include <optional>
#include <string>

namespace velmora {

// Reads the whole file; false when it cannot be read, is empty or is longer than `limit` bytes (no more than that is
// ever read, even from a file that grows or has no length).
[[nodiscard]] bool ReadWholeFile(const char* fileName, std::size_t limit, std::string* content);

// Writes text to a stream; false aborts.
using TextWriter = std::function<bool(std::FILE*)>;

// Replaces or creates a file with what `write` writes, using the platform's line ends. The text goes to a temporary
// file in the same folder, which is renamed when complete, so that an existing file survives any failure. Where that is
// not possible (the folder accepts no new files, or the name is not a plain file) the file is written in place. False
// after any failure; a file that was written in place may then be incomplete.
[[nodiscard]] bool ReplaceTextFile(const char* fileName, const TextWriter& write);

// The few file operations that the functions above need and that differ between systems (file_system_win32.cpp,
// file_system_posix.cpp).

#ifdef _WIN32
using NativePath = std::wstring;
#else
using NativePath = std::string;
#endif

// The path that an 8-bit name stands for, with any link to another file resolved; false when there is none.
[[nodiscard]] bool MakeNativePath(const char* fileName, NativePath* path);

// The 8-bit name of a UTF-8 path; nothing when it has no exact one.
[[nodiscard]] std::optional<std::string> FileNameFromUtf8(const std::string& path);

// Binary, for reading; null when it cannot be opened, or is a folder or a device.
[[nodiscard]] std::FILE* OpenForReading(const NativePath& path);
// For writing text, truncated; null when it cannot be opened or is write-protected.
[[nodiscard]] std::FILE* OpenForWriting(const NativePath& path);

// Creates a new file with a unique name in the folder of `path`, opened for writing text. Null when the folder accepts
// none, and when `path` exists but is not a plain file or must not be written.
[[nodiscard]] std::FILE* CreateBeside(const NativePath& path, NativePath* beside);
// Moves `beside` to `path`, replacing an existing file.
[[nodiscard]] bool RenameOver(const NativePath& beside, const NativePath& path);
void Remove(const NativePath& path);

// Keeps hostile XML away from the parser, which recurses once per level, searches an element's attributes one by one
// and builds a tree of everything it reads.

inline constexpr int kXmlDepthLimit = 64;      // nested elements
inline constexpr int kXmlAttributeLimit = 64;  // attributes of one element
inline constexpr int kXmlNodeLimit = 500'000;  // elements, texts, comments and the like

// Scans a zero-terminated document in one pass, without allocating, by the lexical rules of the XML library. False when
// a limit is exceeded or when the parser would stop with an error. A document that passes may still contain one (an end
// tag with another name, a repeated attribute, a bad entity).
[[nodiscard]] bool IsWithinXmlLimits(const char* document) noexcept;

}  // namespace velmora

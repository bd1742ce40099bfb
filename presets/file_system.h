// The few file operations that differ between platforms.
#pragma once

#include <cstdio>
#include <string>

namespace velmora {

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

// Finds the library that a Windows host loads. Windows only.
#pragma once

#include <string>

namespace velmora::hosts {

// `path` is in the system's code page, as the command line gave it; empty: VMReelEffects.dll beside this program.
[[nodiscard]] std::wstring LibraryFile(const std::string& path);
// The same for a path in 16-bit text.
[[nodiscard]] std::wstring LibraryFile(const std::wstring& path);

}  // namespace velmora::hosts

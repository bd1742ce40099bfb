// Finds the library that a Windows host loads. Windows only.
#pragma once

#include <string>

namespace velmora::hosts {

// `path` is in the system's code page, as the command line gave it; empty: VMReelEffects.dll beside this program.
[[nodiscard]] std::wstring LibraryFile(const std::string& path);

}  // namespace velmora::hosts

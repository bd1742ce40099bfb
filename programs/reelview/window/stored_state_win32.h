// What the program remembers between runs, in the user's part of the registry. Windows only.
#pragma once

#include <windows.h>

#include <optional>

#include "programs/reelview/document/recent_files.h"

namespace velmora::reelview {

[[nodiscard]] RecentFiles StoredRecentFiles();
void StoreRecentFiles(const RecentFiles& files);

[[nodiscard]] std::optional<WINDOWPLACEMENT> StoredPlace();
void StorePlace(HWND window);

}  // namespace velmora::reelview

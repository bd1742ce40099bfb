// Films through the system's Media Foundation source reader, where there is one: MP4, MOV, WMV from Windows 7 on.
// Windows only; COM must be initialised on the thread.
#pragma once

#include <memory>
#include <string>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

// Throws SourceError.
[[nodiscard]] std::unique_ptr<ClipSource> OpenMediaClip(const std::wstring& file);

}  // namespace velmora::reelview

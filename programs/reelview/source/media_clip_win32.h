// Films through the system's media source reader, where it has one: MP4, MOV, WMV from Windows 7 on. Windows only; the
// thread has COM.
#pragma once

#include <memory>
#include <string>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

// Throws SourceError.
[[nodiscard]] std::unique_ptr<ClipSource> OpenMediaClip(const std::wstring& file);

}  // namespace velmora::reelview

// AVI files through the system's AVI interface. Windows only.
#pragma once

#include <memory>
#include <string>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

// Throws SourceError when the file is not an AVI file or no installed codec decodes it.
[[nodiscard]] std::unique_ptr<ClipSource> OpenAviClip(const std::wstring& file);

}  // namespace velmora::reelview

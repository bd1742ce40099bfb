// YUV4MPEG2 files with random access to frames.
#pragma once

#include <filesystem>
#include <memory>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

// Throws SourceError. A truncated file gives its complete frames.
[[nodiscard]] std::unique_ptr<ClipSource> OpenY4mClip(const std::filesystem::path& file);

}  // namespace velmora::reelview

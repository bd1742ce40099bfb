// YUV4MPEG2 files, any frame in any order.
#pragma once

#include <filesystem>
#include <memory>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

// Throws SourceError. A file that was cut off gives the frames that are whole.
[[nodiscard]] std::unique_ptr<ClipSource> OpenY4mClip(const std::filesystem::path& file);

}  // namespace velmora::reelview

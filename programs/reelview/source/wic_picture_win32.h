// Pictures through the system's imaging component. Windows only; the thread has COM.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

// PNG, JPEG, BMP, TIFF and whatever else the system reads. Throws SourceError.
[[nodiscard]] Picture ReadPicture(const std::wstring& file);
// Throws SourceError (text::kCannotWrite).
void WritePng(const std::wstring& file, const Picture& picture);

// One picture, or several of one size after another. Throws SourceError.
[[nodiscard]] std::unique_ptr<ClipSource> OpenPictures(std::vector<std::wstring> files);
// A picture and those of its folder that continue its number.
[[nodiscard]] std::unique_ptr<ClipSource> OpenSequence(const std::wstring& file);

}  // namespace velmora::reelview

// Reads and writes pictures through the Windows Imaging Component. Windows only; COM must be initialised on the
// thread.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

// PNG, JPEG, BMP, TIFF and any other format that the system reads. Throws SourceError.
[[nodiscard]] Picture ReadPicture(const std::wstring& file);
// Throws SourceError (text::kCannotWrite).
void WritePng(const std::wstring& file, const Picture& picture);

// One picture, or a sequence of pictures of the same size. Throws SourceError.
[[nodiscard]] std::unique_ptr<ClipSource> OpenPictures(std::vector<std::wstring> files);
// A picture and the files in its folder that continue its numbering.
[[nodiscard]] std::unique_ptr<ClipSource> OpenSequence(const std::wstring& file);

}  // namespace velmora::reelview

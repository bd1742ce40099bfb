// Frames as PNG pictures. Windows only; the thread has COM.
#pragma once

#include <memory>
#include <string>

#include "programs/reelview/keeper/frame_sink.h"

namespace velmora::reelview {

// film.png becomes film0000.png, film0001.png and so on. Throws SourceError, also when one of them exists.
[[nodiscard]] std::unique_ptr<FrameSink> MakePngSink(const std::wstring& file, const ClipFacts& facts);
// One picture, in place of whatever has its name. Throws SourceError.
void SavePng(const std::wstring& file, const Picture& picture);

}  // namespace velmora::reelview

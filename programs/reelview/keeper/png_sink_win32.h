// Saves frames as PNG pictures. Windows only; COM must be initialised on the thread.
#pragma once

#include <memory>
#include <string>

#include "programs/reelview/keeper/frame_sink.h"

namespace velmora::reelview {

// film.png becomes film0000.png, film0001.png and so on. Throws SourceError, also when one of them exists.
[[nodiscard]] std::unique_ptr<FrameSink> MakePngSink(const std::wstring& file, const ClipFacts& facts);
// Writes one picture and replaces an existing file. Throws SourceError.
void SavePng(const std::wstring& file, const Picture& picture);

}  // namespace velmora::reelview

// Saves AVI films through the system's AVI interface. Windows only.
#pragma once

#include <windows.h>
#include <vfw.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "programs/reelview/keeper/frame_sink.h"

namespace velmora::reelview {

struct AviCodec {
    DWORD handler = 0;  // 0: uncompressed
    DWORD quality = 0, keyFrameEvery = 0;
    std::vector<std::uint8_t> state;  // the codec's own settings
};

// Shows the system's dialog; empty when the user cancelled it.
[[nodiscard]] std::optional<AviCodec> ChooseAviCodec(HWND owner, hosts::FrameSize size);

// Throws SourceError.
[[nodiscard]] std::unique_ptr<FrameSink> MakeAviSink(const std::wstring& file, const ClipFacts& facts,
                                                     const AviCodec& codec);

}  // namespace velmora::reelview

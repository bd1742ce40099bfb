// Renders a whole clip to a file. Windows only; Run is called on the rendering thread.
#pragma once

#include <windows.h>
#include <vfw.h>

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "programs/reelview/library/engine.h"
#include "programs/reelview/keeper/frame_sink.h"

namespace velmora::reelview {

// AVI films go through the system's AVI interface.
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

// COM must be initialised on the thread for both. film.png becomes film0000.png, film0001.png and so on. Throws
// SourceError, also when one of them exists.
[[nodiscard]] std::unique_ptr<FrameSink> MakePngSink(const std::wstring& file, const ClipFacts& facts);
// Writes one picture and replaces an existing file. Throws SourceError.
void SavePng(const std::wstring& file, const Picture& picture);

enum class ClipKind { kAviPlain, kAviCodec, kPngSequence, kY4m };

struct ExportOrder {
    std::wstring file;
    ClipKind kind = ClipKind::kY4m;
    AviCodec codec;
    std::uint32_t effect = 0;
    Values values;
};

enum class ExportEnd { kDone, kCancelled, kFailed };
struct ExportResult {
    ExportEnd end = ExportEnd::kDone;
    std::string error;  // for kFailed: a key of the user-visible texts
};

// `progress` is called after each frame with the number of finished frames. Does not throw.
[[nodiscard]] ExportResult RunExport(Engine& engine, const ExportOrder& order,
                                     const std::atomic<bool>& isCancelled,
                                     const std::function<void(std::int64_t)>& progress);

}  // namespace velmora::reelview

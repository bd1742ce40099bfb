// Renders a whole clip to a file. Windows only; Run is called on the rendering thread.
#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>

#include "programs/reelview/keeper/avi_sink_win32.h"
#include "programs/reelview/library/engine.h"

namespace velmora::reelview {

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

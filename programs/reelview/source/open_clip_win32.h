// Opens whatever the system reads. Windows only; the thread has COM.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

struct ClipRequest {
    std::vector<std::wstring> files;  // several: pictures one after another
    bool isSequence = false;          // the first is one of a numbered sequence
};

// Throws SourceError; std::bad_alloc when memory is short.
[[nodiscard]] std::unique_ptr<ClipSource> OpenClip(const ClipRequest& request);

}  // namespace velmora::reelview

// Opens any file that the system can read. Windows only; COM must be initialised on the thread.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

struct ClipRequest {
    std::vector<std::wstring> files;  // more than one: a sequence of pictures
    bool isSequence = false;          // the first file belongs to a numbered sequence
};

// Throws SourceError, or std::bad_alloc when there is not enough memory.
[[nodiscard]] std::unique_ptr<ClipSource> OpenClip(const ClipRequest& request);

}  // namespace velmora::reelview

// Where a clip's frames go. Used on the rendering thread only.
#pragma once

#include <filesystem>
#include <memory>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

class FrameSink {
  public:
    // What was not finished leaves nothing behind.
    virtual ~FrameSink() = default;
    FrameSink(const FrameSink&) = delete;
    FrameSink& operator=(const FrameSink&) = delete;

    // Frames in their order, all of the clip's size. Throws SourceError.
    virtual void Write(const Picture& picture) = 0;
    // After the last frame: what was written stands under its name. Throws SourceError.
    virtual void Finish() = 0;

  protected:
    FrameSink() = default;
};

// In the clip's own format when it was such a stream, else 4:4:4. Throws SourceError.
[[nodiscard]] std::unique_ptr<FrameSink> MakeY4mSink(const std::filesystem::path& file,
                                                     const ClipFacts& facts);

}  // namespace velmora::reelview

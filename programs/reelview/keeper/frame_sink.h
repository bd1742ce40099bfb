// Destination for a clip's frames. Used on the rendering thread only.
#pragma once

#include <filesystem>
#include <memory>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

class FrameSink {
  public:
    // An unfinished file leaves nothing behind.
    virtual ~FrameSink() = default;
    FrameSink(const FrameSink&) = delete;
    FrameSink& operator=(const FrameSink&) = delete;

    // Frames in order, all of the clip's size. Throws SourceError.
    virtual void Write(const Picture& picture) = 0;
    // Call after the last frame: the file then gets its final name. Throws SourceError.
    virtual void Finish() = 0;

  protected:
    FrameSink() = default;
};

// In the clip's own format if it was a YUV4MPEG2 stream, else in 4:4:4. Throws SourceError.
[[nodiscard]] std::unique_ptr<FrameSink> MakeY4mSink(const std::filesystem::path& file,
                                                     const ClipFacts& facts);

}  // namespace velmora::reelview

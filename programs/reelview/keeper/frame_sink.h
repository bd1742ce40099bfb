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

// A file that gets its final name only when it is complete.
class SafeFile {
  public:
    explicit SafeFile(std::filesystem::path target);
    // Removes an unfinished file.
    ~SafeFile();
    SafeFile(const SafeFile&) = delete;
    SafeFile& operator=(const SafeFile&) = delete;

    // The path to write to: next to the target and with its extension, because some formats are chosen by extension.
    [[nodiscard]] const std::filesystem::path& Place() const { return m_place; }
    // Moves the file, which must be closed, to the target. Throws SourceError (text::kCannotWrite) and then leaves
    // the target unchanged.
    void Finish();

  private:
    std::filesystem::path m_target, m_place;
    bool m_isFinished = false;
};

}  // namespace velmora::reelview

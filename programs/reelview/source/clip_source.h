// An open source: a picture, or a sequence of frames. Used on the rendering thread only.
#pragma once

#include <cstdint>
#include <filesystem>
#include <istream>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "text/number_text.h"
#include "programs/common/y4m.h"
#include "programs/reelview/base/picture.h"

namespace velmora::reelview {

// Its text is a key of the user-visible texts (base/texts.h).
class SourceError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// A pattern that names numbered pictures.
struct Numbering {
    std::u16string pattern;  // as printf takes it: "frame%04d.png"; a percent sign in a name is doubled
    std::uint64_t first = 0;
};

struct ClipFacts {
    hosts::FrameSize size;
    hosts::FrameRate rate = {25, 1};
    std::int64_t frames = 1;  // may be an estimate: reading past the true end repeats the last frame
    // Set for a YUV4MPEG2 stream, so that it can be saved in the same format.
    std::optional<hosts::Y4mFormat> y4m;
    bool isPictures = false;  // several pictures; `numbering` says whether one pattern names them all
    std::optional<Numbering> numbering;
};

class ClipSource {
  public:
    virtual ~ClipSource() = default;
    ClipSource(const ClipSource&) = delete;
    ClipSource& operator=(const ClipSource&) = delete;

    [[nodiscard]] const ClipFacts& Facts() const { return m_facts; }
    // `frame` is 0..frames - 1. Throws SourceError.
    [[nodiscard]] virtual Picture Read(std::int64_t frame) = 0;

  protected:
    ClipSource() = default;

    ClipFacts m_facts;
};

// How a JPEG or TIFF file says that its picture was held: 1 to 8 as Exif has it, 1 if it does not say.
[[nodiscard]] int StoredOrientation(std::istream& file);

// Larger sides are refused, because no buffer for them fits into 32 bits.
inline constexpr std::int32_t kLargestSide = 16384;
// Throws SourceError when a frame of this size is empty or too large.
void CheckSize(hosts::FrameSize size);

// A YUV4MPEG2 file. Throws SourceError. A truncated file gives its complete frames.
[[nodiscard]] std::unique_ptr<ClipSource> OpenY4mClip(const std::filesystem::path& file);

// Numbered pictures: `name` is a file's name, `names` lists its folder. Returns the names that differ from it only in the
// last run of digits, in numerical order, up to the first missing number; at least `name` itself.
[[nodiscard]] std::vector<std::u16string> SequenceOf(const std::u16string& name,
                                                     const std::vector<std::u16string>& names);

// Of paths in order. Empty unless they differ only in consecutive numbers, all padded to the same width.
[[nodiscard]] std::optional<Numbering> NumberingOf(const std::vector<std::u16string>& paths);

}  // namespace velmora::reelview

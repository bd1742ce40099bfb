// Something opened: a picture, or frames one after another. Used on the rendering thread only.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>

#include "text/number_text.h"
#include "programs/common/y4m.h"
#include "programs/reelview/base/picture.h"

namespace velmora::reelview {

// Its text is a key of the texts shown to users (base/text_keys.h).
class SourceError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct ClipFacts {
    hosts::FrameSize size;
    hosts::FrameRate rate = {25, 1};
    std::int64_t frames = 1;  // may be an estimate: reading past the true end repeats the last frame
    std::optional<hosts::Y4mFormat>
        y4m;  // of a YUV4MPEG2 stream, so that it can be written in its own format
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

// A side of more pixels is refused: no buffer of it can be had in 32 bits.
inline constexpr std::int32_t kLargestSide = 16384;
// Throws SourceError when a frame of this size is empty or too large.
void CheckSize(hosts::FrameSize size);

}  // namespace velmora::reelview

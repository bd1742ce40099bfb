// A frame in memory: rows from the top without padding, pixels of the bytes blue, green, red, alpha.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "text/number_text.h"

namespace velmora::reelview {

struct Picture {
    hosts::FrameSize size;
    std::vector<std::uint8_t> pixels;

    [[nodiscard]] static std::size_t BytesOf(hosts::FrameSize size) {
        return static_cast<std::size_t>(size.width) * static_cast<std::size_t>(size.height) * 4;
    }
};

using SharedPicture = std::shared_ptr<const Picture>;

// The mean of the pixels behind each, for small pictures of presets; never larger than `picture`.
[[nodiscard]] Picture Reduced(const Picture& picture, hosts::FrameSize largest);

}  // namespace velmora::reelview

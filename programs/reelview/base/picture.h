// A frame in memory: top-down rows without padding, bytes in the order blue, green, red, alpha.
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

// As the viewer sees a picture that is stored with this Exif orientation, 1 to 8; any other leaves it as it is.
[[nodiscard]] Picture Turned(Picture picture, int orientation);

// For thumbnails: each pixel is the mean of the source pixels that it covers. Never larger than `picture`.
[[nodiscard]] Picture Reduced(const Picture& picture, hosts::FrameSize largest);

}  // namespace velmora::reelview

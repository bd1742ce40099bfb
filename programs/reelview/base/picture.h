// Pictures, rectangles and colours: what everything that draws shares.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "text/number_text.h"

namespace velmora::reelview {

// A frame in memory: top-down rows without padding, bytes in the order blue, green, red, alpha.
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

// In pixels.
struct Box {
    std::int32_t left = 0, top = 0, right = 0, bottom = 0;

    [[nodiscard]] std::int32_t Width() const { return right - left; }
    [[nodiscard]] std::int32_t Height() const { return bottom - top; }
    [[nodiscard]] bool Meets(const Box& other) const {
        return left < other.right && other.left < right && top < other.bottom && other.top < bottom;
    }
};

// The size of a dialog unit in pixels.
struct UnitScale {
    double x = 1.5, y = 1.625;
};

// Each as 0x00RRGGBB.
struct KnobColours {
    std::uint32_t background = 0xF0F0F0, track = 0xC8C8C8, value = 0xB07830, body = 0xFAFAFA, rim = 0x909090,
                  pointer = 0x303030, focus = 0x0060C0;
};

}  // namespace velmora::reelview

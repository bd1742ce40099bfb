#include "programs/reelview/base/picture.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace velmora::reelview {
namespace {

hosts::FrameSize FittedSize(hosts::FrameSize size, hosts::FrameSize largest) {
    const double factor = std::min({1.0, static_cast<double>(largest.width) / size.width,
                                    static_cast<double>(largest.height) / size.height});
    return {std::max(static_cast<std::int32_t>(std::lround(size.width * factor)), 1),
            std::max(static_cast<std::int32_t>(std::lround(size.height * factor)), 1)};
}

std::size_t Edge(std::int32_t index, std::int32_t count, std::int32_t sourceCount) {
    return static_cast<std::size_t>(std::int64_t{index} * sourceCount / count);
}

}  // namespace

Picture Turned(Picture picture, int orientation) {
    if (orientation < 2 || orientation > 8) return picture;
    const bool isOnItsSide = orientation >= 5;
    const bool isMirroredX = orientation == 2 || orientation == 3 || orientation == 7 || orientation == 8;
    const bool isMirroredY = orientation == 3 || orientation == 4 || orientation == 6 || orientation == 7;
    const std::int32_t width = picture.size.width, height = picture.size.height;
    Picture result;
    result.size = isOnItsSide ? hosts::FrameSize{height, width} : picture.size;
    result.pixels.resize(picture.pixels.size());
    std::uint8_t* out = result.pixels.data();
    for (std::int32_t y = 0; y < result.size.height; ++y) {
        for (std::int32_t x = 0; x < result.size.width; ++x, out += 4) {
            std::int32_t fromX = isOnItsSide ? y : x, fromY = isOnItsSide ? x : y;
            if (isMirroredX) fromX = width - 1 - fromX;
            if (isMirroredY) fromY = height - 1 - fromY;
            std::memcpy(out, picture.pixels.data() + (std::ptrdiff_t{fromY} * width + fromX) * 4, 4);
        }
    }
    return result;
}

Picture Reduced(const Picture& picture, hosts::FrameSize largest) {
    Picture result;
    result.size = FittedSize(picture.size, largest);
    result.pixels.resize(Picture::BytesOf(result.size));
    std::uint8_t* out = result.pixels.data();
    const std::size_t rowBytes = static_cast<std::size_t>(picture.size.width) * 4;
    for (std::int32_t row = 0; row < result.size.height; ++row) {
        const std::size_t top = Edge(row, result.size.height, picture.size.height);
        const std::size_t bottom = Edge(row + 1, result.size.height, picture.size.height);
        for (std::int32_t column = 0; column < result.size.width; ++column, out += 4) {
            const std::size_t left = Edge(column, result.size.width, picture.size.width);
            const std::size_t right = Edge(column + 1, result.size.width, picture.size.width);
            std::uint64_t sums[4] = {};
            for (std::size_t y = top; y < bottom; ++y) {
                const std::uint8_t* pixel = picture.pixels.data() + y * rowBytes + left * 4;
                for (std::size_t x = left; x < right; ++x, pixel += 4) {
                    for (int channel = 0; channel < 4; ++channel) sums[channel] += pixel[channel];
                }
            }
            // Never 0, as the result is no larger than the picture.
            const std::uint64_t count = std::max<std::uint64_t>(1, (bottom - top) * (right - left));
            for (int channel = 0; channel < 4; ++channel) {
                out[channel] = static_cast<std::uint8_t>((sums[channel] + count / 2) / count);
            }
        }
    }
    return result;
}

}  // namespace velmora::reelview

#include "programs/reelview/base/picture.h"

#include <algorithm>
#include <cmath>

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
            const std::uint64_t count = (bottom - top) * (right - left);
            for (int channel = 0; channel < 4; ++channel) {
                out[channel] = static_cast<std::uint8_t>((sums[channel] + count / 2) / count);
            }
        }
    }
    return result;
}

}  // namespace velmora::reelview

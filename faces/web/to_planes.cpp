#include <algorithm>

#include "faces/web/effect_page.h"

namespace {

struct Rgb {
    std::int32_t red, green, blue;
};

Rgb At(const std::uint8_t* pixel) noexcept {
    return {pixel[0], pixel[1], pixel[2]};
}

// Shares of BT.709 in 65536ths, narrowed to 219 and 224 steps; each row sums to what keeps grey grey.
std::uint8_t Luma(const Rgb& c) noexcept {
    return static_cast<std::uint8_t>((11966 * c.red + 40254 * c.green + 4064 * c.blue + (16 << 16) + 32768) >>
                                     16);
}
std::uint8_t BlueDifference(const Rgb& c) noexcept {
    return static_cast<std::uint8_t>(
        (-6596 * c.red - 22189 * c.green + 28785 * c.blue + (128 << 16) + 32768) >> 16);
}
std::uint8_t RedDifference(const Rgb& c) noexcept {
    return static_cast<std::uint8_t>(
        (28785 * c.red - 26145 * c.green - 2640 * c.blue + (128 << 16) + 32768) >> 16);
}

}  // namespace

void ToPlanes(const std::uint8_t* pixels, std::uint8_t* planes, std::int32_t width, std::int32_t height) {
    const std::int32_t halfWidth = (width + 1) / 2, halfHeight = (height + 1) / 2;
    for (std::int32_t i = 0; i < width * height; ++i) planes[i] = Luma(At(pixels + i * 4));
    std::uint8_t* blue = planes + width * height;
    std::uint8_t* red = blue + halfWidth * halfHeight;
    for (std::int32_t y = 0; y < height; y += 2) {
        const std::uint8_t* rows[2] = {pixels + y * width * 4,
                                       pixels + std::min(y + 1, height - 1) * width * 4};
        for (std::int32_t x = 0; x < width; x += 2) {
            Rgb sum = {2, 2, 2};  // rounds the mean of four
            for (const std::uint8_t* row : rows) {
                for (const std::int32_t column : {x, std::min(x + 1, width - 1)}) {
                    const Rgb pixel = At(row + column * 4);
                    sum = {sum.red + pixel.red, sum.green + pixel.green, sum.blue + pixel.blue};
                }
            }
            const Rgb mean = {sum.red / 4, sum.green / 4, sum.blue / 4};
            *blue++ = BlueDifference(mean);
            *red++ = RedDifference(mean);
        }
    }
}

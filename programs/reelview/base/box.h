// Rectangles in pixels, and the pixel size of a dialog unit.
#pragma once

#include <cstdint>

namespace velmora::reelview {

struct Box {
    std::int32_t left = 0, top = 0, right = 0, bottom = 0;

    [[nodiscard]] std::int32_t Width() const { return right - left; }
    [[nodiscard]] std::int32_t Height() const { return bottom - top; }
    [[nodiscard]] bool Meets(const Box& other) const {
        return left < other.right && other.left < right && top < other.bottom && other.top < bottom;
    }
};

struct UnitScale {
    double x = 1.5, y = 1.625;
};

}  // namespace velmora::reelview

// The fractions of a wear picture at one amount: what the row kernels of wear read instead of bytes.
#pragma once

#include <array>
#include <cstdint>

#include "render/pictures.h"

namespace velmora::render {

// Kept from frame to frame, since the amount seldom changes.
class WearFractions {
  public:
    // No wear picture has more pixels.
    static constexpr std::int32_t kMostPixels = 50 * 300;

    // Serves `picture` at `amount` (0..1) from now on.
    void Set(const GreyPicture& picture, float amount) noexcept;
    // The fractions from a pixel of the picture on, its rows lying one after the other without gaps. At least
    // kWidestWear numbers may be read, whatever lies behind the last pixel.
    [[nodiscard]] const float* From(std::int32_t row) const noexcept {
        return m_values.data() + row * m_picture->width;
    }

  private:
    const GreyPicture* m_picture = nullptr;
    float m_amount = 0.0f;
    std::array<float, kMostPixels + kWidestWear> m_values{};
};

}  // namespace velmora::render

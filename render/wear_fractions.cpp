#include "render/wear_fractions.h"

#include "render/wear.h"

namespace velmora::render {

void WearFractions::Set(const GreyPicture& picture, float amount) noexcept {
    if (m_picture == &picture && m_amount == amount) return;
    m_picture = &picture;
    m_amount = amount;
    std::array<float, 256> byByte;
    for (std::size_t b = 0; b < byByte.size(); ++b) {
        byByte[b] = WearFraction(static_cast<std::uint8_t>(b), amount);
    }
    float* next = m_values.data();
    for (std::int32_t y = 0; y < picture.height; ++y) {
        const std::uint8_t* row = picture.pixels + y * picture.rowStep;
        for (std::int32_t x = 0; x < picture.width; ++x) *next++ = byByte[row[x]];
    }
}

}  // namespace velmora::render

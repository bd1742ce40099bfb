// The factors of a wear picture at one amount, for the row kernels of wear.
//
// A wear byte's fraction (render/wear.h) has a factor if, for every distance 0..255 of a channel to white,
//   ((distance × 256 × times >> 16) + plus) >> 8
// is what shading by the fraction adds. 16-bit integers then give the bytes that are defined by products in single
// precision. `times` is within a few units of 65536 times the fraction, `plus` is near half of 256. About one byte in
// several thousand has no factor, and no fraction outside 0..1 has one. Such bytes are called odd; the pixels under
// them are shaded one by one.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>

#include "render/growing_memory.h"
#include "render/pictures.h"
#include "render/wear.h"

namespace velmora::render {

struct WearFactor {
    std::uint16_t times;
    std::uint16_t plus;
};

// The factor of a fraction, if there is one.
[[nodiscard]] std::optional<WearFactor> WearFactorOf(float fraction) noexcept;

// The factors over one row of a frame, strip by strip from the left.
class WearStrips {
  public:
    // A row kernel may read this many numbers before a strip's first one and after its last one.
    static constexpr std::int32_t kPadding = 16;

    // `factors` is a picture of `size`, at least kPadding columns wide, stored row after row without gaps, with padding
    // before the first row and after the last. `starts` are the rows of it that the strips have in row 0 of the frame,
    // and one more for vectors that reach beyond the last strip; this is row `y`.
    struct Size {
        std::int32_t width, height;
    };
    WearStrips(const std::uint16_t* starts, std::int32_t y, const WearFactor* factors, Size size) noexcept
        : m_starts(starts), m_factors(factors), m_size(size), m_down(y % size.height) {}

    [[nodiscard]] std::int32_t Width() const noexcept { return m_size.width; }
    const WearFactor* Next() noexcept {
        const std::int32_t row = *m_starts++ + m_down;
        return m_factors + (row < m_size.height ? row : row - m_size.height) * m_size.width;
    }

  private:
    const std::uint16_t* m_starts;
    const WearFactor* m_factors;
    Size m_size;
    std::int32_t m_down;
};

// Kept from frame to frame, since the amount seldom changes.
class WearFactors {
  public:
    // No built-in wear picture has more pixels.
    static constexpr std::int32_t kMostPixels = 50 * 300;

    // Prepares the factors of `picture` at `amount`. Returns false, and leaves no factors, if the picture has more than
    // kMostPixels pixels or fewer than WearStrips::kPadding columns.
    [[nodiscard]] bool Set(const GreyPicture& picture, float amount) noexcept;

    // Draws where the `count` strips of a frame start, one draw each. Needs factors. False if there is not enough memory.
    // Allocates only for a frame wider than those before.
    [[nodiscard]] bool SetStrips(Random random, std::uint32_t count, std::int32_t frameWidth) noexcept;

    // Over row `y` of the frame; needs strips.
    [[nodiscard]] WearStrips Over(std::int32_t y) const noexcept {
        return {m_starts.Data(),
                y,
                m_factors.data() + WearStrips::kPadding,
                {m_picture->width, m_picture->height}};
    }
    // Whether the kernels leave out pixels: those under odd bytes.
    [[nodiscard]] bool HasOddBytes() const noexcept { return m_hasOddBytes; }
    [[nodiscard]] bool IsOdd(std::uint8_t byte) const noexcept { return m_isOdd[byte]; }

  private:
    const GreyPicture* m_picture = nullptr;
    float m_amount = 0.0f;
    bool m_hasOddBytes = false;
    GrowingMemory<std::uint16_t> m_starts;
    std::array<bool, 256> m_isOdd{};
    std::array<WearFactor, kMostPixels + 2 * WearStrips::kPadding> m_factors{};
};

}  // namespace velmora::render

// Spots: stamps small grey pictures of dust and dirt at random places, in random orientations and strengths,
// darkening or lightening the picture under each.
//
// Under spot byte b with key k and strength m a pixel is shaded by m (b - k) / k for b <= k, else by
// m (b - k) / (255 - k): the key leaves it alone.
#pragma once

#include <array>
#include <cstdint>

#include "render/image.h"
#include "render/pictures.h"
#include "render/random.h"
#include "render/stage_settings.h"

namespace velmora::render {

enum class SpotOrientation : std::int32_t {
    kAsStored = 0,
    kMirroredLeftRight = 1,
    kMirroredTopBottom = 2,
    kQuarterClockwise = 3,
    kHalfTurn = 4,
    kQuarterCounterClockwise = 5,
};

// A spot placed on the frame. Positions count from the processed rectangle's top left corner and may be outside it.
struct PlacedSpot {
    const GreyPicture* picture;
    SpotOrientation orientation;
    float strength;
    std::int32_t top;
    std::int32_t left;
    std::int32_t height;  // as oriented
    std::int32_t width;

    // The byte at a row and column of the oriented picture.
    [[nodiscard]] std::uint8_t ByteAt(std::int32_t row, std::int32_t column) const noexcept;
};

// The fraction by which spot byte `byte` shades a pixel.
[[nodiscard]] float SpotFraction(std::uint8_t byte, std::uint8_t key, float strength) noexcept;

// How many spots a setting (0..100) puts on a frame.
[[nodiscard]] std::uint32_t SpotCount(const StageSettings& settings) noexcept;

class SpotStage {
  public:
    static constexpr bool kIsDamage = true;
    static std::uint32_t Draws(const StageSettings& settings, std::int32_t) noexcept {
        constexpr std::uint32_t kDrawsPerSpot = 6;
        return kDrawsPerSpot * SpotCount(settings);
    }
    static constexpr std::uint32_t kMostSpots = 25;

    [[nodiscard]] bool IsActive() const noexcept { return m_count != 0; }
    [[nodiscard]] std::uint32_t Count() const noexcept { return m_count; }
    [[nodiscard]] const PlacedSpot& Spot(std::uint32_t index) const noexcept { return m_spots[index]; }

    // Row `y` of the processed rectangle, in place when `in` is `out`, which it may be.
    void Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;

  private:
    friend SpotStage PrepareSpots(const StageSettings&, const Rectangle&, Random&) noexcept;

    std::uint32_t m_count = 0;
    std::array<PlacedSpot, kMostSpots> m_spots{};
};

// Places the frame's spots: six draws each. `region` is the destination's processed rectangle in its buffer.
[[nodiscard]] SpotStage PrepareSpots(const StageSettings& settings, const Rectangle& region,
                                     Random& random) noexcept;

}  // namespace velmora::render

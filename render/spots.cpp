#include "render/spots.h"

#include <algorithm>
#include <cstring>

#include "render/rounding.h"
#include "render/image.h"

namespace velmora::render {
namespace {

bool IsQuarterTurn(SpotOrientation orientation) noexcept {
    return orientation == SpotOrientation::kQuarterClockwise ||
           orientation == SpotOrientation::kQuarterCounterClockwise;
}

PlacedSpot PlaceSpot(std::int32_t level, const Rectangle& region, Random& random) noexcept {
    PlacedSpot spot;
    spot.picture = &SpotPicture(random.Draw(0, kSpotCount - 1));
    spot.orientation = static_cast<SpotOrientation>(random.Draw(0, 5));
    spot.strength = Narrow(random.Draw(level / 8, std::min(2 * level, 100)) / 100.0);
    random.Draw(level / 8, level);  // only to advance the random sequence

    // The place is drawn using the stored size, whatever the orientation.
    const std::int32_t h = spot.picture->height, w = spot.picture->width;
    const std::int32_t y = random.Draw(region.top + 1 - (h - h / 2), region.bottom + 1 - h / 2);
    const std::int32_t x = random.Draw(region.left + 1 - (w - w / 2), region.right + 1 - w / 2);
    const bool turned = IsQuarterTurn(spot.orientation);
    spot.height = turned ? w : h;
    spot.width = turned ? h : w;
    spot.top = y - spot.height / 2 - region.top;
    spot.left = x - spot.width / 2 - region.left;
    return spot;
}

}  // namespace

std::uint8_t PlacedSpot::ByteAt(std::int32_t row, std::int32_t column) const noexcept {
    const std::int32_t lastRow = picture->height - 1, lastColumn = picture->width - 1;
    std::int32_t storedRow = row, storedColumn = column;
    switch (orientation) {
        case SpotOrientation::kAsStored:
            break;
        case SpotOrientation::kMirroredLeftRight:
            storedColumn = lastColumn - column;
            break;
        case SpotOrientation::kMirroredTopBottom:
            storedRow = lastRow - row;
            break;
        case SpotOrientation::kHalfTurn:
            storedRow = lastRow - row;
            storedColumn = lastColumn - column;
            break;
        case SpotOrientation::kQuarterClockwise:
            storedRow = lastRow - column;
            storedColumn = row;
            break;
        case SpotOrientation::kQuarterCounterClockwise:
            storedRow = column;
            storedColumn = lastColumn - row;
            break;
    }
    return picture->pixels[storedRow * picture->rowStep + storedColumn];
}

float SpotFraction(std::uint8_t byte, std::uint8_t key, float strength) noexcept {
    const double difference = byte - key;
    return Narrow(strength * (difference / (byte <= key ? key : 255 - key)));
}

std::uint32_t SpotCount(const StageSettings& settings) noexcept {
    const std::uint32_t level = RoundToUnsigned(settings.spots);
    return level == 0 ? 0 : std::clamp(level / 4, 1u, SpotStage::kMostSpots);
}

SpotStage PrepareSpots(const StageSettings& settings, const Rectangle& region, Random& random) noexcept {
    SpotStage stage;
    stage.m_count = SpotCount(settings);
    const std::int32_t level = static_cast<std::int32_t>(RoundToUnsigned(settings.spots));
    for (std::uint32_t i = 0; i < stage.m_count; ++i) stage.m_spots[i] = PlaceSpot(level, region, random);
    return stage;
}

void SpotStage::Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (in != out) std::memcpy(out, in, static_cast<std::size_t>(width) * sizeof(Bgra));
    for (std::uint32_t i = 0; i < m_count; ++i) {
        const PlacedSpot& spot = m_spots[i];
        const std::int32_t row = y - spot.top;
        if (row < 0 || row >= spot.height) continue;
        const std::uint8_t key = spot.picture->pixels[0];
        const std::int32_t end = std::min(spot.left + spot.width, width);
        for (std::int32_t x = std::max(spot.left, 0); x < end; ++x) {
            const std::uint8_t byte = spot.ByteAt(row, x - spot.left);
            if (byte == key) continue;
            out[x] = ShadePixel(out[x], SpotFraction(byte, key, spot.strength));
        }
    }
}

}  // namespace velmora::render

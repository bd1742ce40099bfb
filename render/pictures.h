// The grey pictures that wear and spots lay over a frame. They are PGM files in render/pictures, where an artist can
// change them, and the build embeds them.
#pragma once

#include <cstdint>

namespace velmora::render {

// A stored picture: one byte per pixel, rows from the top, `rowStep` bytes from one row to the next.
// The pixels are constant data and live as long as the program.
struct GreyPicture {
    std::int32_t width;
    std::int32_t height;
    std::int32_t rowStep;
    const std::uint8_t* pixels;
};

// The wear pictures have the menu values from 2000 without a gap.
inline constexpr int kWearPictureCount = 7;
inline constexpr int kSpotCount = 11;

// The tables that the build generates from the files in render/pictures.
struct WearEntry {
    std::int32_t menuValue;
    GreyPicture picture;
};

// In menu order; an entry with the value 0 ends the table.
extern const WearEntry kWearTable[];

extern const GreyPicture kSpotTable[kSpotCount];

// The largest width of a wear picture.
inline constexpr std::int32_t kWidestWear = 64;

// The wear picture of an item value of the "Pattern" menu; any other value gives 2000's.
// 0 is intact film, 255 is film worn down to the base. The picture wraps from the last row to the first.
inline const GreyPicture& WearPicture(std::int32_t menuValue) noexcept {
    for (const WearEntry* entry = kWearTable; entry->menuValue != 0; ++entry) {
        if (entry->menuValue == menuValue) return entry->picture;
    }
    return kWearTable[0].picture;
}

// The spot at `index`, which must be in 0..kSpotCount − 1. Its first byte is its key (1 to 254), the level that leaves
// the frame unchanged. Darker bytes are dirt, brighter ones clear specks. The whole border has the key's value.
inline const GreyPicture& SpotPicture(std::int32_t index) noexcept {
    return kSpotTable[index];
}

}  // namespace velmora::render

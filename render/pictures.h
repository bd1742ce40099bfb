#pragma once

// The grey pictures of damage that wear and spots lay over a frame. They lie as PGM files in render/pictures,
// where an artist can change them, and are embedded by the build.

#include <cstdint>

namespace velmora::render {

// A stored picture: one byte per pixel, rows from the top, `rowStep` bytes from one row to the next.
// The pixels are constant data of the program and never go away.
struct GreyPicture {
    std::int32_t width;
    std::int32_t height;
    std::int32_t rowStep;
    const std::uint8_t* pixels;
};

// No wear picture is wider.
inline constexpr std::int32_t kWidestWear = 64;

// The wear picture of an item value of the "Pattern" menu, 2000..2006; any other value gives 2000's.
// 0 is intact film, 255 film worn down to the base. The last row continues in the first.
const GreyPicture& WearPicture(std::int32_t menuValue) noexcept;

inline constexpr int kSpotCount = 11;

// The spot at `index`, which must be in 0..kSpotCount − 1. Its first byte is its key, the level that leaves
// the frame as it is (between 1 and 254): darker bytes are dirt, brighter ones clear specks. The whole
// border holds the key.
const GreyPicture& SpotPicture(std::int32_t index) noexcept;

}  // namespace velmora::render

// Pixels and the views through which the stages read and write them.
#pragma once

#include <cstdint>
#include <limits>

#include "render/rounding.h"

namespace velmora::render {

// One pixel, 32 bits: bytes blue, green, red, alpha in memory, that is 0xAARRGGBB as a little-endian word.
struct Bgra {
    std::uint8_t blue;
    std::uint8_t green;
    std::uint8_t red;
    std::uint8_t alpha;
};
static_assert(sizeof(Bgra) == 4 && alignof(Bgra) == 1);

// Bytes in a row of `width` pixels.
using RowBytesOf = std::int64_t (*)(std::int32_t width) noexcept;
[[nodiscard]] constexpr std::int64_t BgraRowBytes(std::int32_t width) noexcept {
    return std::int64_t{width} * 4;
}

// Rows from `first` to before `end`, counted from the top; both may lie outside the picture.
struct RowRange {
    std::int32_t first = 0;
    std::int32_t end = std::numeric_limits<std::int32_t>::max();
};

// Rows and columns of a buffer; bottom and right are exclusive.
struct Rectangle {
    std::int32_t top;
    std::int32_t bottom;
    std::int32_t left;
    std::int32_t right;

    [[nodiscard]] constexpr bool IsEmpty() const noexcept { return bottom <= top || right <= left; }
    [[nodiscard]] constexpr std::int32_t Width() const noexcept { return right - left; }
    [[nodiscard]] constexpr std::int32_t Height() const noexcept { return bottom - top; }
    [[nodiscard]] Rectangle Clipped(const Rectangle& bounds) const noexcept;
    bool operator==(const Rectangle&) const = default;
};

// A picture as passed by the caller. Not owned. The region to process is width x height pixels with its top left
// corner at (xOrigin, yOrigin) of the buffer. A negative row step means that the buffer is stored bottom-up, with
// `pixels` at the first stored row.
struct FrameDescription {
    void* pixels = nullptr;
    std::int32_t width = 0;
    std::int32_t height = 0;
    std::int32_t rowStep = 0;
    std::int32_t xOrigin = 0;
    std::int32_t yOrigin = 0;
};

// The view through which stages read and write. Rows, origins and shifts count from the lowest address, also for a
// buffer stored bottom-up. Does not own the pixels. Empty views are not valid.
struct ImageView {
    std::int32_t bufferWidth = 0;
    std::int32_t bufferHeight = 0;
    std::int32_t rowStep = 0;  // bytes, positive when valid; need not be a multiple of 4
    std::uint8_t* base = nullptr;
    std::int32_t top = 0;
    std::int32_t bottom = 0;
    std::int32_t left = 0;
    std::int32_t right = 0;

    // First pixel of the processed part of a row; `row` counts from the top of the processed rectangle.
    [[nodiscard]] Bgra* Row(std::int32_t row) const noexcept {
        return reinterpret_cast<Bgra*>(base + std::ptrdiff_t{rowStep} * (top + row)) + left;
    }
    [[nodiscard]] constexpr Rectangle Region() const noexcept { return {top, bottom, left, right}; }
    [[nodiscard]] constexpr bool IsValid() const noexcept { return base != nullptr; }
};

// A view of a frame whose processed rectangle is width x height pixels. All validation of frames is here: the view is
// not valid if numbers overflow, rows do not fit their step or there are no pixels.
[[nodiscard]] ImageView ViewOf(const FrameDescription& frame, std::int32_t width, std::int32_t height,
                               RowBytesOf rowBytes = BgraRowBytes) noexcept;

// A row of a picture that may be shifted: `count` pixels from `pixels` start at column `start`, and the border fills
// the other columns.
struct ShiftedRow {
    const Bgra* pixels;
    std::int32_t start;
    std::int32_t count;
    std::uint32_t border;

    // Writes columns `from` to `to`, which is exclusive, to `out`.
    void Copy(std::int32_t from, std::int32_t to, Bgra* out) const noexcept;
};

// Writes the word to `count` pixels.
void FillPixels(Bgra* pixels, std::int32_t count, std::uint32_t colour) noexcept;

// Rows of a picture, for a stage that needs their neighbours.
class RowReader {
  public:
    // Row `y` of the processed rectangle, from 0.
    [[nodiscard]] virtual ShiftedRow RowAt(std::int32_t y) const noexcept = 0;

  protected:
    ~RowReader() = default;
};

// What wear and spots do to a pixel: its colour moves toward white or black by a fraction.

// One channel by `fraction` (-1..1): above 0 toward white, below 0 toward black, 0 leaves it. The product is
// single precision, rounded half away from zero; the result keeps its low 8 bits.
[[nodiscard]] inline std::uint8_t ShadeChannel(std::uint8_t channel, float fraction) noexcept {
    const double distance = fraction > 0.0f ? 255 - channel : channel;
    return static_cast<std::uint8_t>(channel + RoundHalfAway(Narrow(fraction * distance)));
}

// Alpha is kept.
[[nodiscard]] inline Bgra ShadePixel(Bgra pixel, float fraction) noexcept {
    return {ShadeChannel(pixel.blue, fraction), ShadeChannel(pixel.green, fraction),
            ShadeChannel(pixel.red, fraction), pixel.alpha};
}

}  // namespace velmora::render

// Packed images and the conversions between packed YCbCr 4:2:2 and RGB.
//
// A 4:2:2 row holds 4 bytes for each started pair of pixels: Y0 Cb Y1 Cr. An RGB row holds 3 bytes for each
// pixel: red, green, blue. Coefficients are those of studio-range ITU-R BT.601 in 16-bit fixed point, with
// small bias terms of their own.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "render/image.h"

namespace velmora::render {

enum class ImagingStatus : std::int32_t { kDone = 0, kBadSize = -6, kNullPointer = -8 };

// A packed 8-bit image that owns its pixels. Grows, never shrinks.
class PackedImage {
  public:
    // Room for width x height pixels of `channels` bytes (1..4). False when memory is short or a size is
    // below 1; the image is then empty.
    [[nodiscard]] bool Reserve(std::int32_t width, std::int32_t height, std::int32_t channels) noexcept;
    [[nodiscard]] std::uint8_t* Row(std::int32_t row) const noexcept {
        return m_pixels.get() + m_rowStep * static_cast<std::size_t>(row);
    }
    [[nodiscard]] std::size_t RowStep() const noexcept { return m_rowStep; }

  private:
    std::unique_ptr<std::uint8_t[]> m_pixels;
    std::size_t m_rowStep = 0;  // bytes
    std::int32_t m_width = 0;
    std::int32_t m_height = 0;
};

// Bytes of a 4:2:2 row of a width.
[[nodiscard]] constexpr std::int64_t YcbcrRowBytes(std::int32_t width) noexcept {
    return (std::int64_t{width} + 1) / 2 * 4;
}

// One row each. The last pixel of an odd width has no partner: reading takes its Cr from the group before
// (a width of 1 from its own), writing touches only its Y and Cb.
void YcbcrRowToRgb(const std::uint8_t* source, std::uint8_t* rgb, std::int32_t width) noexcept;
void RgbRowToYcbcr(const std::uint8_t* rgb, std::uint8_t* destination, std::int32_t width) noexcept;

// The same without a detour over RGB, for `width` >= 0 pixels that all have their group: the last one of an odd
// width takes its Cr from its own group's fourth byte, and writing touches only its Y and Cb. Input and output must
// not overlap.
struct YcbcrKernels {
    void (*toBgra)(const std::uint8_t* source, Bgra* out, std::int32_t width, std::uint8_t alpha) noexcept;
    void (*fromBgra)(const Bgra* in, std::uint8_t* destination, std::int32_t width) noexcept;
};

// One row from 4:2:2 of `sourceWidth` pixels to its first `width` pixels, with the lone last pixel's rule.
void YcbcrRowToBgra(const YcbcrKernels& kernels, const std::uint8_t* source, std::int32_t sourceWidth,
                    Bgra* out, std::int32_t width, std::uint8_t alpha) noexcept;

// Whole pictures; row steps in bytes, may be negative. A null pointer or a size below 1 touches nothing.
[[nodiscard]] ImagingStatus YcbcrToRgb(const std::uint8_t* source, std::ptrdiff_t sourceStep,
                                       std::uint8_t* rgb, std::ptrdiff_t rgbStep, std::int32_t width,
                                       std::int32_t height) noexcept;
[[nodiscard]] ImagingStatus RgbToYcbcr(const std::uint8_t* rgb, std::ptrdiff_t rgbStep,
                                       std::uint8_t* destination, std::ptrdiff_t destinationStep,
                                       std::int32_t width, std::int32_t height) noexcept;

}  // namespace velmora::render

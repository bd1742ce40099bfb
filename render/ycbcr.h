// Packed images and the conversions between packed YCbCr 4:2:2 and RGB.
//
// A 4:2:2 row holds 4 bytes for each pair of pixels, also for an incomplete last one: Y0 Cb Y1 Cr. An RGB row holds 3
// bytes for each pixel: red, green, blue. The coefficients are those of studio-range ITU-R BT.601 in 16-bit fixed
// point, with additional small bias terms.
#pragma once

#include <cstddef>
#include <cstdint>

#include "render/growing_memory.h"
#include "render/image.h"

namespace velmora::render {

enum class ImagingStatus : std::int32_t { kDone = 0, kBadSize = -6, kNullPointer = -8 };

// A packed 8-bit image that owns its pixels. Grows, never shrinks.
class PackedImage {
  public:
    // Allocates width x height pixels of `channels` bytes (1..4). Returns false if there is not enough memory or a size
    // is below 1; the image is then empty.
    [[nodiscard]] bool Reserve(std::int32_t width, std::int32_t height, std::int32_t channels) noexcept;
    [[nodiscard]] std::uint8_t* Row(std::int32_t row) const noexcept {
        return m_pixels.Data() + m_rowStep * static_cast<std::size_t>(row);
    }
    [[nodiscard]] std::size_t RowStep() const noexcept { return m_rowStep; }

  private:
    GrowingMemory<std::uint8_t> m_pixels;
    std::size_t m_rowStep = 0;  // bytes
    std::int32_t m_width = 0;
    std::int32_t m_height = 0;
};

// Bytes in a 4:2:2 row.
[[nodiscard]] constexpr std::int64_t YcbcrRowBytes(std::int32_t width) noexcept {
    return (std::int64_t{width} + 1) / 2 * 4;
}

// One row each. The last pixel of an odd width has no partner: reading takes its Cr from the previous group (from its
// own if the width is 1), writing touches only its Y and Cb.
void YcbcrRowToRgb(const std::uint8_t* source, std::uint8_t* rgb, std::int32_t width) noexcept;
void RgbRowToYcbcr(const std::uint8_t* rgb, std::uint8_t* destination, std::int32_t width) noexcept;

// The same without going through RGB, for `width` >= 0 pixels in complete groups: the last pixel of an odd width takes
// its Cr from the fourth byte of its own group, and writing touches only its Y and Cb. Input and output must not
// overlap.
struct YcbcrKernels {
    void (*toBgra)(const std::uint8_t* source, Bgra* out, std::int32_t width, std::uint8_t alpha) noexcept;
    void (*fromBgra)(const Bgra* in, std::uint8_t* destination, std::int32_t width) noexcept;
};

// Converts the first `width` pixels of a 4:2:2 row of `sourceWidth` pixels, with the rule for a last pixel without
// partner.
void YcbcrRowToBgra(const YcbcrKernels& kernels, const std::uint8_t* source, std::int32_t sourceWidth,
                    Bgra* out, std::int32_t width, std::uint8_t alpha) noexcept;

// Whole pictures. Row steps are in bytes and may be negative. With a null pointer or a size below 1 nothing is done.
[[nodiscard]] ImagingStatus YcbcrToRgb(const std::uint8_t* source, std::ptrdiff_t sourceStep,
                                       std::uint8_t* rgb, std::ptrdiff_t rgbStep, std::int32_t width,
                                       std::int32_t height) noexcept;
[[nodiscard]] ImagingStatus RgbToYcbcr(const std::uint8_t* rgb, std::ptrdiff_t rgbStep,
                                       std::uint8_t* destination, std::ptrdiff_t destinationStep,
                                       std::int32_t width, std::int32_t height) noexcept;

}  // namespace velmora::render

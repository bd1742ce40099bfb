// Pictures in memory that frames are converted to and from. Rows go from the top.
#pragma once

#include <cstddef>
#include <cstdint>

namespace velmora::hosts {

enum class SampleType : std::uint8_t {
    kBytes,   // blue, green, red, alpha: 0..255
    kWords,   // red, green, blue, alpha: 16 bits in the machine's byte order, 0..65535
    kFloats,  // red, green, blue, alpha: black 0, white 1; what a frame has below and above is kept
};

constexpr std::ptrdiff_t BytesPerPixel(SampleType type) {
    return type == SampleType::kBytes ? 4 : type == SampleType::kWords ? 8 : 16;
}

constexpr double WhiteOf(SampleType type) {
    return type == SampleType::kBytes ? 255.0 : type == SampleType::kWords ? 65535.0 : 1.0;
}

template <class Byte>
struct BasicPictureView {
    Byte* rows;             // not owned
    std::ptrdiff_t stride;  // bytes from one row to the next; may be negative
    std::int32_t width, height;
    SampleType samples;

    [[nodiscard]] Byte* Row(std::int32_t y) const { return rows + y * stride; }
};
using PictureView = BasicPictureView<std::uint8_t>;
using ConstPictureView = BasicPictureView<const std::uint8_t>;

// Pictures whose values are proportional to light, as OpenEXR has them (light_curve.cpp). The effects are made for values
// as a screen shows them, so such pictures are converted by sRGB's curve and back. Below 0 the curve continues in a
// straight line, above 1 as it is.

// `light` has floats, `display` samples of any type; alpha is kept. The pictures have one size.
void DisplayOfLight(const ConstPictureView& light, const PictureView& display);
// The other way: `light` has floats.
void LightOfDisplay(const ConstPictureView& display, const PictureView& light);

}  // namespace velmora::hosts

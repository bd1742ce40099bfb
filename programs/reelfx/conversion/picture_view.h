// A picture in memory that frames are converted to and from. Rows go from the top.
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

}  // namespace velmora::hosts

#include "render/ycbcr.h"

#include <algorithm>
#include <limits>

#include "render/kernels.h"

namespace velmora::render {
namespace {

std::uint8_t Saturate16(std::int32_t value) noexcept {
    return static_cast<std::uint8_t>(std::clamp(value >> 16, 0, 255));
}

void WriteRgb(std::uint8_t* rgb, std::int32_t y, std::int32_t cb, std::int32_t cr) noexcept {
    const std::int32_t luma = 76284 * y;
    rgb[0] = Saturate16(luma + 104595 * cr - 14608761);
    rgb[1] = Saturate16(luma - 25690 * cb - 53281 * cr + 8887730);
    rgb[2] = Saturate16(luma + 132186 * cb - 18140365);
}

// The left pixel of a pair is rounded (16.5 added), the right one truncated (16.0 added).
constexpr std::int32_t kLeftBias = 0x108000;
constexpr std::int32_t kRightBias = 0x100000;

std::uint8_t Luma(const std::uint8_t* rgb, std::int32_t bias) noexcept {
    return static_cast<std::uint8_t>((16843 * rgb[0] + 33030 * rgb[1] + 6423 * rgb[2] + bias) >> 16);
}

Bgra DecodedPixel(std::int32_t y, std::int32_t cb, std::int32_t cr, std::uint8_t alpha) noexcept {
    std::uint8_t rgb[3];
    WriteRgb(rgb, y, cb, cr);
    return {rgb[2], rgb[1], rgb[0], alpha};
}

void ToBgra(const std::uint8_t* source, Bgra* out, std::int32_t width, std::uint8_t alpha) noexcept {
    for (std::int32_t x = 0; x < width; ++x) {
        const std::uint8_t* group = source + x / 2 * std::ptrdiff_t{4};
        out[x] = DecodedPixel(group[x % 2 * 2], group[1], group[3], alpha);
    }
}

void FromBgra(const Bgra* in, std::uint8_t* destination, std::int32_t width) noexcept {
    for (std::int32_t x = 0; x < width; x += 2, in += 2, destination += 4) {
        const std::int32_t count = std::min(2, width - x);
        std::uint8_t rgb[6];
        for (std::int32_t i = 0; i < count; ++i) {
            rgb[3 * i] = in[i].red;
            rgb[3 * i + 1] = in[i].green;
            rgb[3 * i + 2] = in[i].blue;
        }
        RgbRowToYcbcr(rgb, destination, count);
    }
}

template <typename RowFunction, typename Source, typename Destination>
ImagingStatus ConvertRows(RowFunction convert, Source* source, std::ptrdiff_t sourceStep,
                          Destination* destination, std::ptrdiff_t destinationStep, std::int32_t width,
                          std::int32_t height) noexcept {
    if (source == nullptr || destination == nullptr) return ImagingStatus::kNullPointer;
    if (width < 1 || height < 1) return ImagingStatus::kBadSize;
    for (std::int32_t row = 0; row < height; ++row) {
        convert(source + sourceStep * row, destination + destinationStep * row, width);
    }
    return ImagingStatus::kDone;
}

}  // namespace

bool PackedImage::Reserve(std::int32_t width, std::int32_t height, std::int32_t channels) noexcept {
    if (width < 1 || height < 1 || channels < 1 || channels > 4) return false;
    if (m_pixels.Data() != nullptr && width <= m_width && height <= m_height) return true;
    width = std::max(width, m_width);
    height = std::max(height, m_height);
    *this = {};  // free the old image before allocating the new one
    constexpr std::uint64_t kMost = std::numeric_limits<std::ptrdiff_t>::max();
    const std::uint64_t rowStep =
        std::uint64_t(static_cast<std::uint32_t>(width)) * static_cast<std::uint32_t>(channels);
    if (rowStep > kMost / static_cast<std::uint32_t>(height)) return false;
    if (m_pixels.Reserve(rowStep * static_cast<std::uint32_t>(height)) == nullptr) return false;
    m_rowStep = static_cast<std::size_t>(rowStep);
    m_width = width;
    m_height = height;
    return true;
}

void YcbcrRowToRgb(const std::uint8_t* source, std::uint8_t* rgb, std::int32_t width) noexcept {
    std::int32_t x = 0;
    for (; x + 1 < width; x += 2, source += 4, rgb += 6) {
        WriteRgb(rgb, source[0], source[1], source[3]);
        WriteRgb(rgb + 3, source[2], source[1], source[3]);
    }
    if (x < width) WriteRgb(rgb, source[0], source[1], x == 0 ? source[3] : source[-1]);
}

void RgbRowToYcbcr(const std::uint8_t* rgb, std::uint8_t* destination, std::int32_t width) noexcept {
    std::int32_t x = 0;
    for (; x + 1 < width; x += 2, rgb += 6, destination += 4) {
        const std::int32_t red = rgb[0] + rgb[3], green = rgb[1] + rgb[4], blue = rgb[2] + rgb[5];
        destination[0] = Luma(rgb, kLeftBias);
        destination[1] =
            static_cast<std::uint8_t>((-9699 * red - 19071 * green + 28770 * blue - 0xFF0000) >> 17);
        destination[2] = Luma(rgb + 3, kRightBias);
        destination[3] =
            static_cast<std::uint8_t>((28770 * red - 24117 * green - 4653 * blue - 0xFF0000) >> 17);
    }
    if (x < width) {
        destination[0] = Luma(rgb, kLeftBias);
        destination[1] =
            static_cast<std::uint8_t>((-9699 * rgb[0] - 19071 * rgb[1] + 28770 * rgb[2] - 0x7F8000) >> 16);
    }
}

const YcbcrKernels kPlainYcbcr = {ToBgra, FromBgra};

void YcbcrRowToBgra(const YcbcrKernels& kernels, const std::uint8_t* source, std::int32_t sourceWidth,
                    Bgra* out, std::int32_t width, std::uint8_t alpha) noexcept {
    kernels.toBgra(source, out, width, alpha);
    if (width != sourceWidth || width % 2 == 0 || width == 1) return;
    const std::uint8_t* group = source + (width - 1) * std::ptrdiff_t{2};
    out[width - 1] = DecodedPixel(group[0], group[1], group[-1], alpha);
}

ImagingStatus YcbcrToRgb(const std::uint8_t* source, std::ptrdiff_t sourceStep, std::uint8_t* rgb,
                         std::ptrdiff_t rgbStep, std::int32_t width, std::int32_t height) noexcept {
    return ConvertRows(YcbcrRowToRgb, source, sourceStep, rgb, rgbStep, width, height);
}

ImagingStatus RgbToYcbcr(const std::uint8_t* rgb, std::ptrdiff_t rgbStep, std::uint8_t* destination,
                         std::ptrdiff_t destinationStep, std::int32_t width, std::int32_t height) noexcept {
    return ConvertRows(RgbRowToYcbcr, rgb, rgbStep, destination, destinationStep, width, height);
}

}  // namespace velmora::render

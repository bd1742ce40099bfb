#include "programs/common/y4m.h"

#include <algorithm>
#include <cmath>
#include <vector>

#include "text/number_text.h"

namespace velmora::hosts {
namespace {

// 16-bit fixed point.
constexpr double kOne = 65536.0;
constexpr std::int32_t kHalf = 32768;

std::int32_t Fixed(double x) {
    return static_cast<std::int32_t>(std::lround(x * kOne));
}

// The weights of red, green and blue in luma.
struct Weights {
    double red, blue;
    [[nodiscard]] constexpr double Green() const { return 1.0 - red - blue; }
};
constexpr Weights WeightsOf(Y4mMatrix matrix) {
    return matrix == Y4mMatrix::kBt709 ? Weights{0.2126, 0.0722} : Weights{0.299, 0.114};
}

// Limited range: luma 16..235, chroma 16..240 about 128.
struct Range {
    std::int32_t lumaOffset;
    double lumaSpan, chromaSpan;
};
constexpr Range kLimited = {16, 219.0 / 255.0, 224.0 / 255.0};
constexpr Range kFull = {0, 1.0, 1.0};

const Range& RangeOf(const Y4mFormat& format) {
    return format.isFullRange ? kFull : kLimited;
}

struct Decoder {
    std::int32_t offset, luma, crToRed, cbToGreen, crToGreen, cbToBlue;

    Decoder(const Range& range, const Weights& weights)
        : offset(range.lumaOffset),
          luma(Fixed(1.0 / range.lumaSpan)),
          crToRed(Fixed(2.0 * (1.0 - weights.red) / range.chromaSpan)),
          cbToGreen(Fixed(-2.0 * (1.0 - weights.blue) * weights.blue / weights.Green() / range.chromaSpan)),
          crToGreen(Fixed(-2.0 * (1.0 - weights.red) * weights.red / weights.Green() / range.chromaSpan)),
          cbToBlue(Fixed(2.0 * (1.0 - weights.blue) / range.chromaSpan)) {}

    void Decode(std::int32_t y, std::int32_t cb, std::int32_t cr, std::uint8_t* pixel) const {
        const std::int32_t base = (y - offset) * luma + kHalf;
        pixel[0] = Byte(base + cbToBlue * (cb - 128));
        pixel[1] = Byte(base + cbToGreen * (cb - 128) + crToGreen * (cr - 128));
        pixel[2] = Byte(base + crToRed * (cr - 128));
        pixel[3] = 255;
    }

    static std::uint8_t Byte(std::int32_t fixed) {
        return static_cast<std::uint8_t>(std::clamp(fixed >> 16, 0, 255));
    }
};

// One channel as a weighted sum of red, green and blue.
struct Encoder {
    std::int32_t offset, red, green, blue;

    static Encoder Luma(const Range& range, const Weights& weights) {
        return {range.lumaOffset, Fixed(weights.red * range.lumaSpan),
                Fixed(weights.Green() * range.lumaSpan), Fixed(weights.blue * range.lumaSpan)};
    }
    static Encoder Cb(const Range& range, const Weights& weights) {
        const double k = range.chromaSpan / (2.0 * (1.0 - weights.blue));
        return {128, Fixed(-weights.red * k), Fixed(-weights.Green() * k), Fixed((1.0 - weights.blue) * k)};
    }
    static Encoder Cr(const Range& range, const Weights& weights) {
        const double k = range.chromaSpan / (2.0 * (1.0 - weights.red));
        return {128, Fixed((1.0 - weights.red) * k), Fixed(-weights.Green() * k), Fixed(-weights.blue * k)};
    }

    // Of `count` pixels whose channels are summed up.
    [[nodiscard]] std::uint8_t Encode(const std::int64_t (&bgr)[3], std::int64_t count) const {
        const std::int64_t sum = red * bgr[2] + green * bgr[1] + blue * bgr[0];
        const std::int64_t rounded = sum + (offset * std::int64_t{65536} + kHalf) * count;
        const std::int64_t divisor = 65536 * count;
        return static_cast<std::uint8_t>(std::clamp<std::int64_t>(rounded / divisor, 0, 255));
    }
};

void EncodePlane(const Y4mFormat& format, const Encoder& encoder, int shiftX, int shiftY,
                 const std::uint8_t* bgra, std::uint8_t* plane) {
    const std::int32_t stepX = 1 << shiftX, stepY = 1 << shiftY;
    for (std::int32_t top = 0; top < format.size.height; top += stepY) {
        const std::int32_t bottom = std::min(top + stepY, format.size.height);
        for (std::int32_t left = 0; left < format.size.width; left += stepX) {
            const std::int32_t right = std::min(left + stepX, format.size.width);
            std::int64_t sums[3] = {};
            for (std::int32_t y = top; y < bottom; ++y) {
                for (std::int32_t x = left; x < right; ++x) {
                    const std::uint8_t* pixel = bgra + (std::ptrdiff_t{y} * format.size.width + x) * 4;
                    for (int channel = 0; channel < 3; ++channel) sums[channel] += pixel[channel];
                }
            }
            *plane++ = encoder.Encode(sums, std::int64_t{bottom - top} * (right - left));
        }
    }
}

void ReadChromaTag(std::string_view value, Y4mFormat& format) {
    struct Row {
        const char* tag;
        bool hasChroma;
        int shiftX, shiftY;
    };
    static constexpr Row kTags[] = {
        {"420", true, 1, 1}, {"420jpeg", true, 1, 1}, {"420mpeg2", true, 1, 1}, {"420paldv", true, 1, 1},
        {"422", true, 1, 0}, {"444", true, 0, 0},     {"mono", false, 0, 0},
    };
    for (const Row& row : kTags) {
        if (value != row.tag) continue;
        format.hasChroma = row.hasChroma;
        format.chromaShiftX = row.shiftX;
        format.chromaShiftY = row.shiftY;
        return;
    }
    throw UsageError("YUV4MPEG2 chroma format \"" + std::string(value) +
                     "\" is not supported; 420, 422, 444 and mono are");
}

}  // namespace

std::int32_t Y4mFormat::ChromaWidth() const {
    return (size.width + (1 << chromaShiftX) - 1) >> chromaShiftX;
}
std::int32_t Y4mFormat::ChromaHeight() const {
    return (size.height + (1 << chromaShiftY) - 1) >> chromaShiftY;
}
std::size_t Y4mFormat::FrameBytes() const {
    const auto luma = static_cast<std::size_t>(size.width) * static_cast<std::size_t>(size.height);
    if (!hasChroma) return luma;
    return luma + 2 * static_cast<std::size_t>(ChromaWidth()) * static_cast<std::size_t>(ChromaHeight());
}

std::optional<Y4mMatrix> ParseY4mMatrix(std::string_view text) {
    if (text == "bt601") return Y4mMatrix::kBt601;
    if (text == "bt709") return Y4mMatrix::kBt709;
    return std::nullopt;
}

Y4mFormat ParseY4mHeader(std::string_view line) {
    constexpr std::string_view kMagic = "YUV4MPEG2";
    if (!line.starts_with(kMagic)) throw UsageError("the input is not a YUV4MPEG2 stream");
    line.remove_prefix(kMagic.size());
    Y4mFormat format;
    std::string sizeText[2];
    while (!line.empty()) {
        const std::size_t space = line.find(' ');
        const std::string_view field = line.substr(0, space);
        line.remove_prefix(space == std::string_view::npos ? line.size() : space + 1);
        if (field.empty()) continue;
        const std::string_view value = field.substr(1);
        if (field[0] == 'W') sizeText[0] = value;
        if (field[0] == 'H') sizeText[1] = value;
        if (field[0] == 'F') format.rate = ParseRate(value).value_or(format.rate);
        if (field[0] == 'C') ReadChromaTag(value, format);
        if (field == "XCOLORRANGE=FULL") format.isFullRange = true;
    }
    const auto size = ParseSize(sizeText[0] + "x" + sizeText[1]);
    if (!size) throw UsageError("the YUV4MPEG2 header has no valid size");
    format.size = *size;
    const bool isHighDefinition = size->width >= 1280 || size->height > 576;
    format.matrix = isHighDefinition ? Y4mMatrix::kBt709 : Y4mMatrix::kBt601;
    return format;
}

void Y4mToBgra(const Y4mFormat& format, const std::uint8_t* planes, std::uint8_t* bgra) {
    const Decoder decoder(RangeOf(format), WeightsOf(format.matrix));
    const std::ptrdiff_t width = format.size.width, chromaWidth = format.ChromaWidth();
    const std::uint8_t* cb = planes + width * format.size.height;
    const std::uint8_t* cr = cb + chromaWidth * format.ChromaHeight();
    for (std::int32_t y = 0; y < format.size.height; ++y) {
        const std::ptrdiff_t chromaRow = (y >> format.chromaShiftY) * chromaWidth;
        for (std::int32_t x = 0; x < format.size.width; ++x, bgra += 4) {
            const std::ptrdiff_t chroma = chromaRow + (x >> format.chromaShiftX);
            decoder.Decode(*planes++, format.hasChroma ? cb[chroma] : 128,
                           format.hasChroma ? cr[chroma] : 128, bgra);
        }
    }
}

void BgraToY4m(const Y4mFormat& format, const std::uint8_t* bgra, std::uint8_t* planes) {
    const Range& range = RangeOf(format);
    const Weights weights = WeightsOf(format.matrix);
    EncodePlane(format, Encoder::Luma(range, weights), 0, 0, bgra, planes);
    if (!format.hasChroma) return;
    std::uint8_t* cb = planes + std::ptrdiff_t{format.size.width} * format.size.height;
    std::uint8_t* cr = cb + std::ptrdiff_t{format.ChromaWidth()} * format.ChromaHeight();
    EncodePlane(format, Encoder::Cb(range, weights), format.chromaShiftX, format.chromaShiftY, bgra, cb);
    EncodePlane(format, Encoder::Cr(range, weights), format.chromaShiftX, format.chromaShiftY, bgra, cr);
}

}  // namespace velmora::hosts

#include "programs/reelfx/conversion/frame_coding.h"

#include <bit>
#include <cstring>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

using Storage = ComponentLayout::Storage;
using Colours = SampleLayout::Colours;

bool IsGrey(const AVPixFmtDescriptor& descriptor) {
    return descriptor.nb_components <= 2;
}

std::optional<ComponentLayout> ComponentOf(const AVPixFmtDescriptor& descriptor, int index) {
    const AVComponentDescriptor& component = descriptor.comp[index];
    ComponentLayout layout = {.plane = component.plane,
                              .step = component.step,
                              .offset = component.offset,
                              .shift = component.shift,
                              .depth = component.depth,
                              .storage = Storage::kByte};
    if ((descriptor.flags & AV_PIX_FMT_FLAG_FLOAT) != 0) {
        const bool isForeign =
            ((descriptor.flags & AV_PIX_FMT_FLAG_BE) != 0) != (std::endian::native == std::endian::big);
        if (component.depth != 32 || isForeign) return std::nullopt;
        layout.storage = Storage::kFloat;
        return layout;
    }
    if (component.depth == 8 && component.shift == 0) return layout;
    if (component.depth <= 8 || component.depth + component.shift > 16 || component.step % 2 != 0)
        return std::nullopt;
    const bool isBig = (descriptor.flags & AV_PIX_FMT_FLAG_BE) != 0;
    layout.storage =
        isBig == (std::endian::native == std::endian::big) ? Storage::kWord : Storage::kSwappedWord;
    return layout;
}

struct LumaWeights {
    double red, blue;
};

LumaWeights WeightsOf(AVColorSpace space) {
    switch (space) {
        case AVCOL_SPC_RGB:
        case AVCOL_SPC_BT709:
            return {0.2126, 0.0722};
        case AVCOL_SPC_FCC:
            return {0.30, 0.11};
        case AVCOL_SPC_SMPTE240M:
            return {0.212, 0.087};
        case AVCOL_SPC_BT2020_NCL:
        case AVCOL_SPC_BT2020_CL:
            return {0.2627, 0.0593};
        default:
            return {0.299, 0.114};
    }
}

double HighestCode(int depth) {
    return depth == 32 ? 1.0 : static_cast<double>((1 << depth) - 1);
}

CodeMatrix RgbMatrix(const SampleLayout& layout) {
    CodeMatrix matrix = {};
    for (std::size_t i = 0; i < 3; ++i) {
        matrix.fromRgb[i][i] = HighestCode(layout.components[i].depth);
        matrix.toRgb[i][i] = 1.0 / matrix.fromRgb[i][i];
    }
    return matrix;
}

}  // namespace

AVColorSpace EffectiveMatrix(AVColorSpace space, int width, int height) {
    if (space != AVCOL_SPC_UNSPECIFIED && space != AVCOL_SPC_RESERVED) return space;
    return width >= 1280 || height > 576 ? AVCOL_SPC_BT709 : AVCOL_SPC_SMPTE170M;
}

bool IsRgb(AVPixelFormat format) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    return descriptor && (descriptor->flags & (AV_PIX_FMT_FLAG_RGB | AV_PIX_FMT_FLAG_PAL)) != 0;
}

FrameCoding CodingOf(const AVFrame& frame) {
    return {frame.width,      frame.height,      static_cast<AVPixelFormat>(frame.format),
            frame.colorspace, frame.color_range, frame.chroma_location};
}

bool IsLinearLight(const AVFrame& frame) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(static_cast<AVPixelFormat>(frame.format));
    return frame.color_trc == AVCOL_TRC_LINEAR && descriptor &&
           (descriptor->flags & AV_PIX_FMT_FLAG_FLOAT) != 0;
}

bool IsFullRange(const FrameCoding& coding) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(coding.format);
    return coding.range == AVCOL_RANGE_JPEG || IsRgb(coding.format) ||
           (descriptor && (IsGrey(*descriptor) || std::strncmp(descriptor->name, "yuvj", 4) == 0));
}

std::optional<SampleLayout> LayoutOf(AVPixelFormat format) {
    constexpr std::uint64_t kStrange =
        AV_PIX_FMT_FLAG_PAL | AV_PIX_FMT_FLAG_BITSTREAM | AV_PIX_FMT_FLAG_HWACCEL | AV_PIX_FMT_FLAG_BAYER;
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    const bool isXyz = format == AV_PIX_FMT_XYZ12LE || format == AV_PIX_FMT_XYZ12BE;
    if (!descriptor || (descriptor->flags & kStrange) != 0 || isXyz) return std::nullopt;
    SampleLayout layout = {};
    layout.colours = IsGrey(*descriptor) ? Colours::kGrey : IsRgb(format) ? Colours::kRgb : Colours::kYcbcr;
    layout.hasAlpha = (descriptor->flags & AV_PIX_FMT_FLAG_ALPHA) != 0;
    layout.chromaWidthShift = descriptor->log2_chroma_w;
    layout.chromaHeightShift = descriptor->log2_chroma_h;
    // The luma samples of packed 4:1:1 are not evenly spaced.
    if (av_pix_fmt_count_planes(format) == 1 && layout.chromaWidthShift > 1) return std::nullopt;
    const int count = layout.ColourCount() + (layout.hasAlpha ? 1 : 0);
    for (int i = 0; i < count; ++i) {
        const std::optional<ComponentLayout> component = ComponentOf(*descriptor, i);
        if (!component) return std::nullopt;
        layout.components[i < layout.ColourCount() ? static_cast<std::size_t>(i) : 3] = *component;
    }
    return layout;
}

CodeMatrix MatrixOf(const FrameCoding& coding, const SampleLayout& layout) {
    if (layout.colours == Colours::kRgb) return RgbMatrix(layout);
    const auto [red, blue] = WeightsOf(EffectiveMatrix(coding.space, coding.width, coding.height));
    const double green = 1.0 - red - blue;
    const int depth = layout.components[0].depth;
    const bool isFull = IsFullRange(coding);
    const double unit = depth == 32 ? 1.0 / 255.0 : static_cast<double>(1 << (depth - 8));
    const double luma = isFull ? HighestCode(depth) : 219.0 * unit;
    const double chroma = isFull ? HighestCode(depth) : 224.0 * unit;
    const double fromBlue = 0.5 / (1.0 - blue) * chroma, fromRed = 0.5 / (1.0 - red) * chroma;
    CodeMatrix matrix = {};
    matrix.zero = {isFull ? 0.0 : 16.0 * unit, 128.0 * unit, 128.0 * unit};
    matrix.fromRgb = {{{red * luma, green * luma, blue * luma},
                       {-red * fromBlue, -green * fromBlue, (1.0 - blue) * fromBlue},
                       {(1.0 - red) * fromRed, -green * fromRed, -blue * fromRed}}};
    matrix.toRgb = {{{1.0 / luma, 0.0, 1.0 / fromRed},
                     {1.0 / luma, -blue / green / fromBlue, -red / green / fromRed},
                     {1.0 / luma, 1.0 / fromBlue, 0.0}}};
    if (layout.colours == Colours::kGrey) {
        for (auto& row : matrix.toRgb) row = {1.0 / luma, 0.0, 0.0};
        matrix.zero = {matrix.zero[0], 0.0, 0.0};
    }
    return matrix;
}

ChromaPosition ChromaPositionOf(const FrameCoding& coding, const SampleLayout& layout) {
    // In the middle of the luma samples that share a chroma sample, unless the stream has a tag.
    ChromaPosition position = {((1 << layout.chromaWidthShift) - 1) / 2.0,
                               ((1 << layout.chromaHeightShift) - 1) / 2.0};
    int x = 0, y = 0;
    if (coding.chroma == AVCHROMA_LOC_UNSPECIFIED || avcodec_enum_to_chroma_pos(&x, &y, coding.chroma) < 0)
        return position;
    if (layout.chromaWidthShift == 1) position.x = x / 256.0;
    if (layout.chromaHeightShift == 1) position.y = y / 256.0;
    return position;
}

}  // namespace velmora::hosts

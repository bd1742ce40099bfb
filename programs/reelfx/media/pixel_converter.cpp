#include "programs/reelfx/media/pixel_converter.h"

#include <algorithm>
#include <utility>

#include "effects/render_session.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/conversion/picture_view.h"

extern "C" {
#include <libavutil/opt.h>
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

// The scaler's full precision: no dithering, and no shortcuts in chroma.
constexpr int kFlags =
    SWS_BICUBIC | SWS_FULL_CHR_H_INT | SWS_FULL_CHR_H_INP | SWS_ACCURATE_RND | SWS_BITEXACT;

// The layout of frames that conversion/ takes.
std::optional<SampleLayout> OwnLayout(AVPixelFormat format, SampleType samples) {
    const std::optional<SampleLayout> layout = LayoutOf(format);
    const bool isBytes = layout && layout->colours == SampleLayout::Colours::kRgb &&
                         layout->components[0].depth == 8 && samples == SampleType::kBytes;
    return isBytes ? std::nullopt : layout;
}

template <class Picture>
bool IsOfSize(const FrameCoding& coding, const Picture& picture) {
    return coding.width == picture.width && coding.height == picture.height;
}

// In the scaler's unit, 1/256 of a luma sample; it guesses if the stream has no tag.
void SetChromaPosition(SwsContext* context, const char* horizontal, const char* vertical,
                       const FrameCoding& coding) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(coding.format);
    if (!descriptor || coding.chroma == AVCHROMA_LOC_UNSPECIFIED) return;
    int x = 0, y = 0;
    if (avcodec_enum_to_chroma_pos(&x, &y, coding.chroma) < 0) return;
    if (descriptor->log2_chroma_w == 1) av_opt_set_int(context, horizontal, x, 0);
    if (descriptor->log2_chroma_h == 1) av_opt_set_int(context, vertical, y, 0);
}

// The scaler has no floats.
FrameCoding PictureCoding(std::int32_t width, std::int32_t height, SampleType samples) {
    return {
        width,         height,           samples == SampleType::kBytes ? AV_PIX_FMT_BGRA : AV_PIX_FMT_RGBA64,
        AVCOL_SPC_RGB, AVCOL_RANGE_JPEG, AVCHROMA_LOC_UNSPECIFIED};
}

std::uint16_t WordOf(float sample) {
    return static_cast<std::uint16_t>(sample > 0.0f ? std::min(sample, 1.0f) * 65535.0f + 0.5f : 0.0f);
}

}  // namespace

void PixelConverter::Prepare(Scaler& scaler, const FrameCoding& from, const FrameCoding& to) {
    if (scaler.context && scaler.from == from && scaler.to == to) return;
    scaler.context = Allocated<ScalerPtr>(sws_alloc_context());
    SwsContext* context = scaler.context.get();
    av_opt_set_int(context, "srcw", from.width, 0);
    av_opt_set_int(context, "srch", from.height, 0);
    av_opt_set_int(context, "src_format", from.format, 0);
    av_opt_set_int(context, "dstw", to.width, 0);
    av_opt_set_int(context, "dsth", to.height, 0);
    av_opt_set_int(context, "dst_format", to.format, 0);
    av_opt_set_int(context, "sws_flags", kFlags, 0);
    SetChromaPosition(context, "src_h_chr_pos", "src_v_chr_pos", from);
    SetChromaPosition(context, "dst_h_chr_pos", "dst_v_chr_pos", to);
    // The matrix is that of the side in YCbCr. Between two RGB sides the scaler may use its own in between.
    const FrameCoding& coded = IsRgb(from.format) ? to : from;
    const AVColorSpace space = EffectiveMatrix(coded.space, coded.width, coded.height);
    const int* matrix = sws_getCoefficients(IsRgb(coded.format) ? SWS_CS_DEFAULT : static_cast<int>(space));
    sws_setColorspaceDetails(context, matrix, IsFullRange(from), matrix, IsFullRange(to), 0, 1 << 16,
                             1 << 16);
    if (sws_init_context(context, nullptr, nullptr) < 0) {
        scaler.context.reset();
        if (sws_isSupportedInput(from.format) != 0 && sws_isSupportedOutput(to.format) != 0)
            throw std::bad_alloc();
        const char* name = av_get_pix_fmt_name(IsRgb(from.format) ? to.format : from.format);
        throw Failure(kExitInput,
                      std::string("pixels of the format ") + (name ? name : "?") + " cannot be converted");
    }
    scaler.from = from;
    scaler.to = to;
}

void PixelConverter::ToPicture(const AVFrame& frame, const PictureView& picture) {
    if (!IsLinearLight(frame)) return CodesToPicture(frame, picture);
    m_light = BgraPicture(picture.width, picture.height, SampleType::kFloats);
    CodesToPicture(frame, m_light.View());
    DisplayOfLight(std::as_const(m_light).View(), picture);
}

void PixelConverter::FromPicture(const ConstPictureView& picture, AVFrame& frame) {
    if (!IsLinearLight(frame)) return CodesFromPicture(picture, frame);
    m_light = BgraPicture(picture.width, picture.height, SampleType::kFloats);
    LightOfDisplay(picture, m_light.View());
    CodesFromPicture(std::as_const(m_light).View(), frame);
}

void PixelConverter::CodesToPicture(const AVFrame& frame, const PictureView& picture) {
    const FrameCoding coding = CodingOf(frame);
    if (!IsOfSize(coding, picture)) return ScaleToPicture(frame, picture);
    auto& [preparedCoding, preparedSamples, conversion] = m_toPicture;
    if (!conversion || preparedCoding != coding || preparedSamples != picture.samples) {
        const auto layout = OwnLayout(coding.format, picture.samples);
        if (!layout) return ScaleToPicture(frame, picture);
        conversion.emplace(coding, *layout, picture.samples, RowKernelsOf(ReadRenderOptions().level));
        preparedCoding = coding;
        preparedSamples = picture.samples;
    }
    conversion->Convert(frame, picture);
}

void PixelConverter::CodesFromPicture(const ConstPictureView& picture, AVFrame& frame) {
    const FrameCoding coding = CodingOf(frame);
    if (!IsOfSize(coding, picture)) return ScaleFromPicture(picture, frame);
    auto& [preparedCoding, preparedSamples, conversion] = m_fromPicture;
    if (!conversion || preparedCoding != coding || preparedSamples != picture.samples) {
        const auto layout = OwnLayout(coding.format, picture.samples);
        if (!layout) return ScaleFromPicture(picture, frame);
        conversion.emplace(picture.samples, coding, *layout, RowKernelsOf(ReadRenderOptions().level));
        preparedCoding = coding;
        preparedSamples = picture.samples;
    }
    conversion->Convert(picture, frame);
}

void PixelConverter::ScaleToPicture(const AVFrame& frame, const PictureView& picture) {
    Prepare(m_toScaler, CodingOf(frame), PictureCoding(picture.width, picture.height, picture.samples));
    const bool isFloat = picture.samples == SampleType::kFloats;
    const std::size_t rowWords = static_cast<std::size_t>(picture.width) * 4;
    if (isFloat) m_words.resize(rowWords * static_cast<std::size_t>(picture.height));
    std::uint8_t* const planes[4] = {isFloat ? reinterpret_cast<std::uint8_t*>(m_words.data())
                                             : picture.rows};
    const int strides[4] = {
        static_cast<int>(isFloat ? static_cast<std::ptrdiff_t>(rowWords * 2) : picture.stride)};
    sws_scale(m_toScaler.context.get(), frame.data, frame.linesize, 0, frame.height, planes, strides);
    for (std::int32_t y = 0; isFloat && y < picture.height; ++y) {
        const std::uint16_t* const in = m_words.data() + rowWords * static_cast<std::size_t>(y);
        std::transform(in, in + rowWords, reinterpret_cast<float*>(picture.Row(y)),
                       [](std::uint16_t word) { return static_cast<float>(word) / 65535.0f; });
    }
}

void PixelConverter::ScaleFromPicture(const ConstPictureView& picture, AVFrame& frame) {
    Prepare(m_fromScaler, PictureCoding(picture.width, picture.height, picture.samples), CodingOf(frame));
    const bool isFloat = picture.samples == SampleType::kFloats;
    const std::size_t rowWords = static_cast<std::size_t>(picture.width) * 4;
    if (isFloat) m_words.resize(rowWords * static_cast<std::size_t>(picture.height));
    for (std::int32_t y = 0; isFloat && y < picture.height; ++y) {
        const auto* const in = reinterpret_cast<const float*>(picture.Row(y));
        std::transform(in, in + rowWords, m_words.data() + rowWords * static_cast<std::size_t>(y), WordOf);
    }
    const std::uint8_t* const planes[4] = {isFloat ? reinterpret_cast<const std::uint8_t*>(m_words.data())
                                                   : picture.rows};
    const int strides[4] = {
        static_cast<int>(isFloat ? static_cast<std::ptrdiff_t>(rowWords * 2) : picture.stride)};
    sws_scale(m_fromScaler.context.get(), planes, strides, 0, picture.height, frame.data, frame.linesize);
}

}  // namespace velmora::hosts

#include "programs/reelfx/media/pixel_converter.h"

#include "programs/reelfx/common/failure.h"

extern "C" {
#include <libavutil/opt.h>
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

// The converter's full precision: no dithering, and no shortcuts in chroma.
constexpr int kFlags =
    SWS_BICUBIC | SWS_FULL_CHR_H_INT | SWS_FULL_CHR_H_INP | SWS_ACCURATE_RND | SWS_BITEXACT;

bool IsFullRange(AVPixelFormat format, AVColorRange range) {
    return IsRgb(format) || range == AVCOL_RANGE_JPEG;
}

// In the converter's unit, 1/256 of a luma sample; it guesses if the stream has no tag.
void SetChromaPosition(SwsContext* context, const char* horizontal, const char* vertical,
                       AVPixelFormat format, AVChromaLocation location) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    if (!descriptor || location == AVCHROMA_LOC_UNSPECIFIED) return;
    int x = 0, y = 0;
    if (avcodec_enum_to_chroma_pos(&x, &y, location) < 0) return;
    if (descriptor->log2_chroma_w == 1) av_opt_set_int(context, horizontal, x, 0);
    if (descriptor->log2_chroma_h == 1) av_opt_set_int(context, vertical, y, 0);
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

PixelConverter::Side PixelConverter::SideOf(const AVFrame& frame) {
    return {frame.width,      frame.height,      static_cast<AVPixelFormat>(frame.format),
            frame.colorspace, frame.color_range, frame.chroma_location};
}

PixelConverter::Side PixelConverter::SideOf(const BgraPicture& picture) {
    return {picture.Width(), picture.Height(), AV_PIX_FMT_BGRA,
            AVCOL_SPC_RGB,   AVCOL_RANGE_JPEG, AVCHROMA_LOC_UNSPECIFIED};
}

void PixelConverter::Prepare(Scaler& scaler, const Side& from, const Side& to) {
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
    SetChromaPosition(context, "src_h_chr_pos", "src_v_chr_pos", from.format, from.chroma);
    SetChromaPosition(context, "dst_h_chr_pos", "dst_v_chr_pos", to.format, to.chroma);
    // The matrix is that of the side in YCbCr; two RGB sides do not use it.
    const Side& coded = IsRgb(from.format) ? to : from;
    const int* matrix = sws_getCoefficients(EffectiveMatrix(coded.space, coded.width, coded.height));
    sws_setColorspaceDetails(context, matrix, IsFullRange(from.format, from.range), matrix,
                             IsFullRange(to.format, to.range), 0, 1 << 16, 1 << 16);
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

void PixelConverter::ToBgra(const AVFrame& frame, BgraPicture& picture) {
    Prepare(m_toBgra, SideOf(frame), SideOf(picture));
    std::uint8_t* const planes[4] = {picture.Row(0), nullptr, nullptr, nullptr};
    const int strides[4] = {static_cast<int>(picture.Stride()), 0, 0, 0};
    sws_scale(m_toBgra.context.get(), frame.data, frame.linesize, 0, frame.height, planes, strides);
}

void PixelConverter::FromBgra(const BgraPicture& picture, AVFrame& frame) {
    Prepare(m_fromBgra, SideOf(picture), SideOf(frame));
    const std::uint8_t* const planes[4] = {picture.Row(0), nullptr, nullptr, nullptr};
    const int strides[4] = {static_cast<int>(picture.Stride()), 0, 0, 0};
    sws_scale(m_fromBgra.context.get(), planes, strides, 0, picture.Height(), frame.data, frame.linesize);
}

}  // namespace velmora::hosts

#include "programs/reelfx/media/encoder_choice.h"

#include <algorithm>
#include <cstdlib>
#include <iterator>
#include <vector>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/container.h"
#include "programs/reelfx/media/pixel_converter.h"

extern "C" {
#include <libavutil/opt.h>
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

// No visible loss at these values; each codec has its own scale.
struct QualityRow {
    const char* codec;
    const char* crf;
};
constexpr QualityRow kQualities[] = {
    {"libx264", "18"},    {"libx265", "20"},    {"libvpx", "10"},
    {"libvpx-vp9", "22"}, {"libaom-av1", "22"}, {"libsvtav1", "24"},
};
// Codecs whose scale runs the other way: the highest value is best, 10 for Theora and 100 for the others.
struct HighestIsBest {
    const char* codec;
    int quality;
};
constexpr HighestIsBest kOtherScales[] = {
    {"libtheora", 9}, {"libwebp", 92}, {"libwebp_anim", 92}, {"libjxl", 95}};
// For codecs with a quantiser instead: 1 is best, 31 worst.
constexpr int kQuantiser = 2;

// A constant: some codecs divide the picture by the number of threads, and a file should not depend on the
// machine.
constexpr int kEncoderThreads = 4;

// These reject sizes that are not multiples of their chroma subsampling.
bool NeedsWholeChroma(const AVCodec& codec) {
    return codec.id == AV_CODEC_ID_H264 || codec.id == AV_CODEC_ID_HEVC || codec.id == AV_CODEC_ID_AV1;
}

bool Fits(const AVCodec& codec, AVPixelFormat format, const PictureSource& source) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    if (!descriptor || (descriptor->flags & AV_PIX_FMT_FLAG_HWACCEL) != 0) return false;
    if (!NeedsWholeChroma(codec)) return true;
    return source.width % (1 << descriptor->log2_chroma_w) == 0 &&
           source.height % (1 << descriptor->log2_chroma_h) == 0;
}

std::vector<AVPixelFormat> FormatsOf(const AVCodec& codec) {
    std::vector<AVPixelFormat> formats;
    if (codec.id == AV_CODEC_ID_WRAPPED_AVFRAME) {  // YUV4MPEG2: the formats that its header can name
        return {AV_PIX_FMT_YUV420P,   AV_PIX_FMT_YUV422P,   AV_PIX_FMT_YUV444P,   AV_PIX_FMT_YUV411P,
                AV_PIX_FMT_YUV420P10, AV_PIX_FMT_YUV422P10, AV_PIX_FMT_YUV444P10, AV_PIX_FMT_YUV420P12,
                AV_PIX_FMT_YUV422P12, AV_PIX_FMT_YUV444P12, AV_PIX_FMT_YUV420P16, AV_PIX_FMT_YUV422P16,
                AV_PIX_FMT_YUV444P16, AV_PIX_FMT_GRAY8};
    }
    for (const AVPixelFormat* f = codec.pix_fmts; f && *f != AV_PIX_FMT_NONE; ++f) formats.push_back(*f);
    return formats;
}

// Codecs with transparency, for containers whose usual codec has none.
struct AlphaRow {
    const char* container;
    const char* codec;
};
constexpr AlphaRow kAlphaCodecs[] = {
    {"mov", "prores_ks"}, {"webm", "libvpx-vp9"}, {"matroska", "ffv1"}, {"nut", "ffv1"}, {"avi", "ffv1"},
};

constexpr char kAlphaHint[] =
    " does not support transparency; ffv1, png, qtrle, prores_ks and, in WebM, libvpx-vp9 do";

// VP8 and VP9 store it in a second stream, which few containers support.
bool HoldsAlpha(const AVCodec& codec, const AVOutputFormat& container) {
    if (codec.id != AV_CODEC_ID_VP8 && codec.id != AV_CODEC_ID_VP9) return true;
    const std::string name = container.name;
    return name == "webm" || name == "matroska";
}

void CheckAlphaHolds(const AVCodec& codec, const AVOutputFormat& container) {
    if (HoldsAlpha(codec, container)) return;
    throw Failure(kExitUsage, std::string("codec ") + codec.name + " in " + container.name + kAlphaHint);
}

AVPixelFormat Closest(std::vector<AVPixelFormat> formats, AVPixelFormat wanted, bool withAlpha) {
    formats.push_back(AV_PIX_FMT_NONE);
    int loss = 0;
    return avcodec_find_best_pix_fmt_of_list(formats.data(), wanted, withAlpha ? 1 : 0, &loss);
}

std::vector<AVPixelFormat> WithAlpha(const std::vector<AVPixelFormat>& formats) {
    std::vector<AVPixelFormat> carrying;
    for (const AVPixelFormat format : formats) {
        if (CarriesAlpha(format)) carrying.push_back(format);
    }
    return carrying;
}

// The source's codec is kept if it is one of these: deeper, lossless or newer than a container's usual one, or the
// usual one elsewhere. Cameras' and discs' older codecs are not.
constexpr AVCodecID kKeptCodecs[] = {
    AV_CODEC_ID_H264,    AV_CODEC_ID_HEVC,    AV_CODEC_ID_AV1,   AV_CODEC_ID_VP9,        AV_CODEC_ID_VP8,
    AV_CODEC_ID_PRORES,  AV_CODEC_ID_FFV1,    AV_CODEC_ID_QTRLE, AV_CODEC_ID_MPEG2VIDEO, AV_CODEC_ID_HUFFYUV,
    AV_CODEC_ID_FFVHUFF, AV_CODEC_ID_UTVIDEO, AV_CODEC_ID_V210,
};

// The encoder of a codec, where there are several and the libraries' first choice is slow or poor.
const AVCodec* EncoderOf(AVCodecID id, const PictureSource& source) {
    if (id == AV_CODEC_ID_PRORES) return avcodec_find_encoder_by_name("prores_ks");
    constexpr int kLeast = 64;
    const bool isWhole = source.width % 2 == 0 && source.height % 2 == 0;
    if (id == AV_CODEC_ID_AV1 && isWhole && source.width >= kLeast && source.height >= kLeast) {
        if (const AVCodec* fast = avcodec_find_encoder_by_name("libsvtav1")) return fast;
    }
    return avcodec_find_encoder(id);
}

const AVCodec* KeptCodec(const AVOutputFormat& container, const PictureSource& source) {
    if (std::ranges::find(kKeptCodecs, source.codec) == std::end(kKeptCodecs)) return nullptr;
    const AVCodecDescriptor* descriptor = avcodec_descriptor_get(source.codec);
    // AVI has no times of display.
    const bool isReordered = descriptor && (descriptor->props & AV_CODEC_PROP_REORDER) != 0;
    const bool isAvi = std::string(container.name) == "avi";
    if ((isAvi && isReordered) || !CanHold(container, source.codec)) return nullptr;
    if (source.codec == AV_CODEC_ID_MPEG2VIDEO && container.video_codec != AV_CODEC_ID_MPEG1VIDEO)
        return nullptr;
    return EncoderOf(source.codec, source);
}

// For sources with transparency: a codec that keeps it, if the container has one.
const AVCodec* AlphaCodec(const AVOutputFormat& container, const PictureSource& source) {
    const AVCodec* kept = KeptCodec(container, source);
    if (kept && HoldsAlpha(*kept, container) && !WithAlpha(FormatsOf(*kept)).empty()) return kept;
    for (const AlphaRow& row : kAlphaCodecs) {
        if (std::string(container.name) == row.container) return avcodec_find_encoder_by_name(row.codec);
    }
    return nullptr;
}

const AVCodec& AskedCodec(const std::string& name, const AVOutputFormat& container) {
    const AVCodec* codec = avcodec_find_encoder_by_name(name.c_str());
    if (!codec) {
        const AVCodecDescriptor* descriptor = avcodec_descriptor_get_by_name(name.c_str());
        if (descriptor) codec = avcodec_find_encoder(descriptor->id);
    }
    if (!codec || codec->type != AVMEDIA_TYPE_VIDEO)
        throw Failure(kExitUsage, "unknown video codec \"" + name + "\"");
    if (avformat_query_codec(&container, codec->id, FF_COMPLIANCE_NORMAL) == 0) {
        throw Failure(kExitUsage,
                      std::string("the format ") + container.name + " cannot hold " + codec->name);
    }
    return *codec;
}

// Effects add colour to grey pictures, so grey becomes a colour format of the same depth.
AVPixelFormat InColour(AVPixelFormat format, bool isFilm) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    if (!descriptor || descriptor->nb_components > 2 || (descriptor->flags & AV_PIX_FMT_FLAG_PAL) != 0)
        return format;
    const int depth = descriptor->comp[0].depth;
    const bool isDeep = depth > 8;
    if (depth > 16) return AV_PIX_FMT_GBRPF32;
    if (isFilm)
        return depth > 12   ? AV_PIX_FMT_YUV420P16
               : depth > 10 ? AV_PIX_FMT_YUV420P12
               : isDeep     ? AV_PIX_FMT_YUV420P10
                            : AV_PIX_FMT_YUV420P;
    if (descriptor->nb_components == 2) return isDeep ? AV_PIX_FMT_RGBA64BE : AV_PIX_FMT_RGBA;
    return isDeep ? AV_PIX_FMT_RGB48BE : AV_PIX_FMT_RGB24;
}

AVPixelFormat AskedPixelFormat(const std::string& name, const AVCodec& codec, const PictureSource& source) {
    const AVPixelFormat asked = av_get_pix_fmt(name.c_str());
    if (asked == AV_PIX_FMT_NONE) throw Failure(kExitUsage, "unknown pixel format \"" + name + '"');
    const std::vector<AVPixelFormat> formats = FormatsOf(codec);
    std::string names;
    for (const AVPixelFormat format : formats) {
        if (format == asked && Fits(codec, asked, source)) return asked;
        if (Fits(codec, format, source)) names += std::string(" ") + av_get_pix_fmt_name(format);
    }
    if (formats.empty()) return asked;
    throw Failure(kExitUsage, std::string("codec ") + codec.name + " does not support pixel format \"" +
                                  name + "\" at this size; it supports" + names);
}

}  // namespace

std::string UsualCodecs() {
    std::string text, last;
    for (const char* name : {"mp4", "mov", "matroska", "webm", "avi", "mpegts"}) {
        const AVOutputFormat* const container = av_guess_format(name, nullptr, nullptr);
        const AVCodec* const codec = container ? avcodec_find_encoder(container->video_codec) : nullptr;
        if (!codec) continue;
        if (codec->name == last) {
            text.append(", ").append(name);
        } else {
            text.append(text.empty() ? "" : "; ").append(codec->name).append(" in ").append(name);
        }
        last = codec->name;
    }
    return text;
}

std::string UsualQualities() {
    std::string text;
    for (const QualityRow& row : kQualities)
        text.append(row.crf).append(" for ").append(row.codec).append(", ");
    return text + "otherwise quantiser " + std::to_string(kQuantiser);
}

bool CarriesAlpha(AVPixelFormat format) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    constexpr std::uint64_t kWanted = AV_PIX_FMT_FLAG_ALPHA, kUnwanted = AV_PIX_FMT_FLAG_PAL;
    return descriptor && (descriptor->flags & kWanted) != 0 && (descriptor->flags & kUnwanted) == 0;
}

const AVOutputFormat& ChooseContainer(const OutputOptions& options) {
    const char* name = options.format ? options.format->c_str() : nullptr;
    if (options.isRawBgra) name = "rawvideo";
    if (!name && options.path == "-") name = "yuv4mpegpipe";
    const AVOutputFormat* format =
        name ? FormatNamed(name) : av_guess_format(nullptr, options.path.c_str(), nullptr);
    if (!format && name) throw Failure(kExitUsage, std::string("unknown format \"") + name + '"');
    if (!format) {
        throw Failure(kExitUsage,
                      options.path + ": unknown file name extension; choose the format with --format");
    }
    // Audio formats take a picture as cover art.
    const bool isSound = format->mime_type && std::string(format->mime_type).starts_with("audio/");
    if (format->video_codec == AV_CODEC_ID_NONE || isSound) {
        throw Failure(kExitUsage, options.path + ": the format " + format->name + " cannot hold video");
    }
    return *format;
}

const AVCodec& ChooseCodec(const OutputOptions& options, const AVOutputFormat& container,
                           const PictureSource& source) {
    if (options.isRawBgra) return *avcodec_find_encoder(AV_CODEC_ID_RAWVIDEO);
    if (options.codec) return AskedCodec(*options.codec, container);
    for (const AlphaRow& row : kAlphaCodecs) {
        if (!options.needsAlpha || std::string(container.name) != row.container) continue;
        if (const AVCodec* codec = avcodec_find_encoder_by_name(row.codec)) return *codec;
    }
    const bool isImage = (container.flags & AVFMT_NOTIMESTAMPS) != 0;
    if (!isImage && !options.needsAlpha) {
        const AVCodec* alpha = source.hasAlpha ? AlphaCodec(container, source) : nullptr;
        if (alpha) return *alpha;
        if (const AVCodec* kept = KeptCodec(container, source)) return *kept;
    }
    AVCodecID id = av_guess_codec(&container, nullptr, options.path.c_str(), nullptr, AVMEDIA_TYPE_VIDEO);
    // MPEG-1 has no fields.
    if (id == AV_CODEC_ID_MPEG1VIDEO && source.isInterlaced) id = AV_CODEC_ID_MPEG2VIDEO;
    const AVCodec* codec = avcodec_find_encoder(id);
    if (!codec) {
        throw Failure(kExitUsage, std::string("no codec available for the format ") + container.name);
    }
    return *codec;
}

AVPixelFormat ChoosePixelFormat(const OutputOptions& options, const AVCodec& codec,
                                const AVOutputFormat& container, const PictureSource& source) {
    if (options.isRawBgra) return AV_PIX_FMT_BGRA;
    if (options.pixelFormat) {
        const AVPixelFormat asked = AskedPixelFormat(*options.pixelFormat, codec, source);
        if (options.needsAlpha && !CarriesAlpha(asked)) {
            throw Failure(kExitUsage,
                          "pixel format " + *options.pixelFormat + " does not support transparency");
        }
        if (options.needsAlpha) CheckAlphaHolds(codec, container);
        return asked;
    }
    const bool isFilm = (container.flags & AVFMT_NOTIMESTAMPS) == 0;
    const AVPixelFormat wanted = InColour(source.format, isFilm);
    std::vector<AVPixelFormat> fitting = FormatsOf(codec);
    std::erase_if(fitting, [&](AVPixelFormat format) { return !Fits(codec, format, source); });
    const auto isGrey = [&](AVPixelFormat format) { return InColour(format, isFilm) != format; };
    if (!std::ranges::all_of(fitting, isGrey)) std::erase_if(fitting, isGrey);
    if (options.needsAlpha) {
        const std::vector<AVPixelFormat> carrying = WithAlpha(fitting);
        if (carrying.empty()) throw Failure(kExitUsage, std::string("codec ") + codec.name + kAlphaHint);
        CheckAlphaHolds(codec, container);
        return Closest(carrying, AV_PIX_FMT_BGRA, true);
    }
    if (!HoldsAlpha(codec, container)) std::erase_if(fitting, CarriesAlpha);
    if (source.hasAlpha && !WithAlpha(fitting).empty()) fitting = WithAlpha(fitting);
    if (fitting.empty()) return wanted;
    if (std::ranges::find(fitting, wanted) != fitting.end()) return wanted;
    // The old formats of full range are only for sources that have it.
    std::vector<AVPixelFormat> usual;
    for (const AVPixelFormat format : fitting) {
        if (!std::string(av_get_pix_fmt_name(format)).starts_with("yuvj")) usual.push_back(format);
    }
    return Closest(usual.empty() ? fitting : usual, wanted, source.hasAlpha);
}

void SetQuality(const OutputOptions& options, const AVCodec& codec, AVCodecContext& encoder) {
    encoder.thread_count = kEncoderThreads;
    // This encoder writes to standard error.
    if (std::string(codec.name) == "libsvtav1") setenv("SVT_LOG", "1", 0);
    // Pictures that are never shown carry no transparency.
    if (codec.id == AV_CODEC_ID_VP8 && CarriesAlpha(encoder.pix_fmt)) {
        av_opt_set(encoder.priv_data, "auto-alt-ref", "0", 0);
    }
    const bool hasCrf = encoder.priv_data && av_opt_find(encoder.priv_data, "crf", nullptr, 0, 0);
    if (options.crf) {
        if (!hasCrf) throw Failure(kExitUsage, std::string("codec ") + codec.name + " has no --crf setting");
        if (av_opt_set(encoder.priv_data, "crf", NumberText(*options.crf).c_str(), 0) < 0) {
            throw Failure(kExitUsage, std::string("--crf ") + NumberText(*options.crf) +
                                          " is outside the range of codec " + codec.name);
        }
        encoder.bit_rate = 0;
        return;
    }
    for (const QualityRow& row : kQualities) {
        if (std::string(codec.name) != row.codec || !hasCrf) continue;
        av_opt_set(encoder.priv_data, "crf", row.crf, 0);
        encoder.bit_rate = 0;
        return;
    }
    encoder.flags |= AV_CODEC_FLAG_QSCALE;
    encoder.global_quality = FF_QP2LAMBDA * kQuantiser;
    for (const HighestIsBest& row : kOtherScales) {
        if (std::string(codec.name) == row.codec) encoder.global_quality = FF_QP2LAMBDA * row.quality;
    }
}

bool NeedsConstantRate(const AVCodec& codec) {
    switch (codec.id) {
        case AV_CODEC_ID_MPEG1VIDEO:
        case AV_CODEC_ID_MPEG2VIDEO:
        case AV_CODEC_ID_MPEG4:
        case AV_CODEC_ID_THEORA:
        case AV_CODEC_ID_RAWVIDEO:
        case AV_CODEC_ID_WRAPPED_AVFRAME:
            return true;
        default:
            return codec.supported_framerates != nullptr;
    }
}

}  // namespace velmora::hosts

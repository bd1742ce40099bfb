#include "programs/reelfx/media/encoder_choice.h"

#include <vector>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"
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
// For codecs with a quantiser instead: 1 is best, 31 worst.
constexpr int kQuantiser = 2;

// A constant: some codecs divide the picture by the number of threads, and a file should not depend on the
// machine.
constexpr int kEncoderThreads = 4;

// These reject sizes that are not multiples of their chroma subsampling.
bool NeedsWholeChroma(const AVCodec& codec) {
    return codec.id == AV_CODEC_ID_H264 || codec.id == AV_CODEC_ID_HEVC || codec.id == AV_CODEC_ID_AV1;
}

bool Fits(const AVCodec& codec, AVPixelFormat format, const AVFrame& source) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    if (!descriptor || (descriptor->flags & AV_PIX_FMT_FLAG_HWACCEL) != 0) return false;
    if (!NeedsWholeChroma(codec)) return true;
    return source.width % (1 << descriptor->log2_chroma_w) == 0 &&
           source.height % (1 << descriptor->log2_chroma_h) == 0;
}

std::vector<AVPixelFormat> FormatsOf(const AVCodec& codec) {
    std::vector<AVPixelFormat> formats;
    if (codec.id == AV_CODEC_ID_WRAPPED_AVFRAME) {  // YUV4MPEG2: the 8-bit formats that its header can name
        return {AV_PIX_FMT_YUV420P, AV_PIX_FMT_YUV422P, AV_PIX_FMT_YUV444P, AV_PIX_FMT_YUV411P,
                AV_PIX_FMT_GRAY8};
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

bool CarriesAlpha(AVPixelFormat format) {
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    constexpr std::uint64_t kWanted = AV_PIX_FMT_FLAG_ALPHA, kUnwanted = AV_PIX_FMT_FLAG_PAL;
    return descriptor && (descriptor->flags & kWanted) != 0 && (descriptor->flags & kUnwanted) == 0;
}

// VP8 and VP9 store it in a second stream, which few containers support.
void CheckAlphaHolds(const AVCodec& codec, const AVOutputFormat& container) {
    if (codec.id != AV_CODEC_ID_VP8 && codec.id != AV_CODEC_ID_VP9) return;
    const std::string name = container.name;
    if (name == "webm" || name == "matroska") return;
    throw Failure(kExitUsage, std::string("codec ") + codec.name + " in " + name + kAlphaHint);
}

AVPixelFormat AlphaPixelFormat(const AVCodec& codec, const AVOutputFormat& container,
                               const std::vector<AVPixelFormat>& fitting) {
    std::vector<AVPixelFormat> formats;
    for (const AVPixelFormat format : fitting) {
        if (CarriesAlpha(format)) formats.push_back(format);
    }
    if (formats.empty()) throw Failure(kExitUsage, std::string("codec ") + codec.name + kAlphaHint);
    CheckAlphaHolds(codec, container);
    formats.push_back(AV_PIX_FMT_NONE);
    int loss = 0;
    return avcodec_find_best_pix_fmt_of_list(formats.data(), AV_PIX_FMT_BGRA, 1, &loss);
}

AVPixelFormat AskedPixelFormat(const std::string& name, const AVCodec& codec, const AVFrame& source) {
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

const AVOutputFormat& ChooseContainer(const OutputOptions& options) {
    const char* name = options.format ? options.format->c_str() : nullptr;
    if (options.isRawBgra) name = "rawvideo";
    if (!name && options.path == "-") name = "yuv4mpegpipe";
    const AVOutputFormat* format = name ? av_guess_format(name, nullptr, nullptr)
                                        : av_guess_format(nullptr, options.path.c_str(), nullptr);
    if (!format && name) throw Failure(kExitUsage, std::string("unknown format \"") + name + '"');
    if (!format) {
        throw Failure(kExitUsage,
                      options.path + ": unknown file name extension; choose the format with --format");
    }
    if (format->video_codec == AV_CODEC_ID_NONE) {
        throw Failure(kExitUsage, options.path + ": the format " + format->name + " cannot hold video");
    }
    return *format;
}

const AVCodec& ChooseCodec(const OutputOptions& options, const AVOutputFormat& container) {
    if (options.isRawBgra) return *avcodec_find_encoder(AV_CODEC_ID_RAWVIDEO);
    if (options.codec) {
        const AVCodec* codec = avcodec_find_encoder_by_name(options.codec->c_str());
        if (!codec) {
            const AVCodecDescriptor* descriptor = avcodec_descriptor_get_by_name(options.codec->c_str());
            if (descriptor) codec = avcodec_find_encoder(descriptor->id);
        }
        if (!codec || codec->type != AVMEDIA_TYPE_VIDEO) {
            throw Failure(kExitUsage, "unknown video codec \"" + *options.codec + "\"");
        }
        if (avformat_query_codec(&container, codec->id, FF_COMPLIANCE_NORMAL) == 0) {
            throw Failure(kExitUsage,
                          std::string("the format ") + container.name + " cannot hold " + codec->name);
        }
        return *codec;
    }
    for (const AlphaRow& row : kAlphaCodecs) {
        if (!options.needsAlpha || std::string(container.name) != row.container) continue;
        if (const AVCodec* codec = avcodec_find_encoder_by_name(row.codec)) return *codec;
    }
    const AVCodecID id =
        av_guess_codec(&container, nullptr, options.path.c_str(), nullptr, AVMEDIA_TYPE_VIDEO);
    const AVCodec* codec = avcodec_find_encoder(id);
    if (!codec) {
        throw Failure(kExitUsage, std::string("no codec available for the format ") + container.name);
    }
    return *codec;
}

AVPixelFormat ChoosePixelFormat(const OutputOptions& options, const AVCodec& codec,
                                const AVOutputFormat& container, const AVFrame& source) {
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
    const auto wanted = static_cast<AVPixelFormat>(source.format);
    std::vector<AVPixelFormat> fitting;
    for (const AVPixelFormat format : FormatsOf(codec)) {
        if (Fits(codec, format, source)) fitting.push_back(format);
    }
    if (options.needsAlpha) return AlphaPixelFormat(codec, container, fitting);
    if (fitting.empty()) return wanted;
    const auto has = [&](AVPixelFormat format) {
        for (const AVPixelFormat each : fitting) {
            if (each == format) return true;
        }
        return false;
    };
    if (has(wanted)) return wanted;
    // Other sources get the format that every player supports, unless the output is still pictures.
    const bool isFilm = (container.flags & AVFMT_NOTIMESTAMPS) == 0;
    if (IsRgb(wanted) && isFilm && has(AV_PIX_FMT_YUV420P)) return AV_PIX_FMT_YUV420P;
    fitting.push_back(AV_PIX_FMT_NONE);
    int loss = 0;
    return avcodec_find_best_pix_fmt_of_list(fitting.data(), wanted, 0, &loss);
}

void SetQuality(const OutputOptions& options, const AVCodec& codec, AVCodecContext& encoder) {
    encoder.thread_count = kEncoderThreads;
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

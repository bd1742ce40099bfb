#include "programs/reelfx/media/media_facts.h"

#include <algorithm>

#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/media/pixel_converter.h"

extern "C" {
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

std::string TextOr(const char* text, const char* otherwise) {
    return text ? text : otherwise;
}

OtherStreamFacts FactsOf(const AVStream& stream) {
    const AVCodecParameters& parameters = *stream.codecpar;
    OtherStreamFacts facts;
    facts.kind = TextOr(av_get_media_type_string(parameters.codec_type), "unknown");
    facts.codec = avcodec_get_name(parameters.codec_id);
    facts.channels = parameters.ch_layout.nb_channels;
    facts.sampleRate = parameters.sample_rate;
    const AVDictionaryEntry* language = av_dict_get(stream.metadata, "language", nullptr, 0);
    if (language && std::string(language->value) != "und") facts.language = language->value;
    return facts;
}

void ReadColours(const AVFrame& first, MediaFacts& facts) {
    facts.matrix = TextOr(av_color_space_name(first.colorspace), "unknown");
    facts.range = TextOr(av_color_range_name(first.color_range), "unknown");
    facts.primaries = TextOr(av_color_primaries_name(first.color_primaries), "unknown");
    facts.transfer = TextOr(av_color_transfer_name(first.color_trc), "unknown");
    const AVColorSpace assumed = IsRgb(static_cast<AVPixelFormat>(first.format))
                                     ? AVCOL_SPC_RGB
                                     : EffectiveMatrix(first.colorspace, first.width, first.height);
    facts.assumedMatrix = TextOr(av_color_space_name(assumed), "unknown");
}

double DurationOf(const MediaReader& reader) {
    const AVStream& picture = reader.Picture();
    if (picture.duration > 0) return static_cast<double>(picture.duration) * av_q2d(picture.time_base);
    const std::int64_t duration = reader.Container().duration;
    return duration > 0 ? static_cast<double>(duration) / AV_TIME_BASE : 0.0;
}

bool IsUneven(const AVStream& picture) {
    const double base = av_q2d(picture.r_frame_rate), mean = av_q2d(picture.avg_frame_rate);
    return base > 0.0 && mean > 0.0 && std::abs(base - mean) > 0.005 * mean;
}

}  // namespace

MediaFacts FactsOf(const MediaReader& reader) {
    const AVFrame& first = reader.FirstFrame();
    const AVStream& picture = reader.Picture();
    const auto format = static_cast<AVPixelFormat>(first.format);
    MediaFacts facts;
    facts.container = reader.Container().iformat->name;
    facts.codec = avcodec_get_name(picture.codecpar->codec_id);
    facts.pixelFormat = TextOr(av_get_pix_fmt_name(format), "unknown");
    if (const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format)) {
        facts.bits = descriptor->comp[0].depth;
    }
    facts.size = facts.shownSize = {first.width, first.height};
    const PictureTurn turn = reader.Turn();
    facts.turn = turn.Degrees();
    facts.isMirrored = turn.IsMirrored();
    if (turn.SwapsSides()) std::swap(facts.shownSize.width, facts.shownSize.height);
    const AVRational guess = reader.PixelShape();
    const AVRational shape = guess.num > 0 ? guess : AVRational{1, 1};
    facts.pixelShape = std::to_string(shape.num) + ":" + std::to_string(shape.den);
    const AVRational rate = reader.FrameRateGuess();
    facts.rate = {rate.num, rate.den};
    facts.isUnevenRate = IsUneven(picture);
    facts.frames = reader.FrameCountGuess();
    facts.seconds = DurationOf(reader);
    facts.isInterlaced = first.interlaced_frame != 0;
    ReadColours(first, facts);
    const AVFormatContext& container = reader.Container();
    for (unsigned i = 0; i < container.nb_streams; ++i) {
        if (container.streams[i] != &picture) facts.others.push_back(FactsOf(*container.streams[i]));
    }
    return facts;
}

SampleType SamplesFor(const MediaFacts& facts) {
    return facts.bits > 8 ? SampleType::kFloats : SampleType::kBytes;
}

std::string DepthText(SampleType samples) {
    return samples == SampleType::kBytes ? "8 bits" : samples == SampleType::kWords ? "16 bits" : "float";
}

std::string RateText(FrameRate rate) {
    return NumberText(static_cast<double>(rate.numerator) / rate.denominator);
}

std::string ShortText(const MediaFacts& facts) {
    std::string text = std::to_string(facts.size.width) + "x" + std::to_string(facts.size.height) + ", " +
                       RateText(facts.rate) + " fps";
    if (facts.frames > 0) text += ", " + std::to_string(facts.frames) + " frames";
    if (facts.seconds > 0.0) text += ", " + NumberText(facts.seconds) + " s";
    return text + ", " + facts.codec + " " + facts.pixelFormat;
}

std::vector<std::string> NotesOn(const MediaFacts& facts) {
    std::vector<std::string> notes;
    const auto note = [&](bool applies, const std::string& text) {
        if (applies) notes.push_back(text);
    };
    note(facts.bits > 8,
         std::to_string(facts.bits) + " bits per channel: the effects work in floating point");
    note(facts.turn != 0, "rotation tag " + std::to_string(facts.turn) +
                              " degrees: effects are applied to the upright picture");
    note(facts.isMirrored, "mirroring tag: effects are applied to the picture as players show it");
    note(facts.isUnevenRate, "variable frame rate: the times of the frames are kept");
    note(facts.isInterlaced, "interlaced: both fields of a frame are rendered as one picture");
    note(facts.matrix == "unknown" && facts.assumedMatrix != "gbr",
         "no colour matrix tagged; assuming " + facts.assumedMatrix + ", as players do at this size");
    note(facts.transfer == "smpte2084" || facts.transfer == "arib-std-b67",
         "high dynamic range (" + facts.transfer +
             "): effects are applied to the code values without conversion");
    note(facts.transfer == "linear" && facts.bits == 32,
         "linear light: the effects work on display values (sRGB's curve); --linear-as-is on the values "
         "themselves");
    note(facts.frames == 0, "the number of frames is unknown until the end");
    return notes;
}

}  // namespace velmora::hosts

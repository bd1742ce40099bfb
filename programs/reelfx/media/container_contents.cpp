#include "programs/reelfx/media/container.h"

#include <algorithm>
#include <initializer_list>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {
namespace {

// Formats whose writers accept any codec, even those that no player supports.
struct ContentsRow {
    const char* format;
    std::initializer_list<AVCodecID> codecs;
};
const ContentsRow kContents[] = {
    {"mpegts", {AV_CODEC_ID_MPEG1VIDEO,   AV_CODEC_ID_MPEG2VIDEO,   AV_CODEC_ID_MPEG4,
                AV_CODEC_ID_H264,         AV_CODEC_ID_HEVC,         AV_CODEC_ID_DIRAC,
                AV_CODEC_ID_VC1,          AV_CODEC_ID_MP1,          AV_CODEC_ID_MP2,
                AV_CODEC_ID_MP3,          AV_CODEC_ID_AAC,          AV_CODEC_ID_AAC_LATM,
                AV_CODEC_ID_AC3,          AV_CODEC_ID_EAC3,         AV_CODEC_ID_DTS,
                AV_CODEC_ID_TRUEHD,       AV_CODEC_ID_OPUS,         AV_CODEC_ID_S302M,
                AV_CODEC_ID_DVB_SUBTITLE, AV_CODEC_ID_DVB_TELETEXT, AV_CODEC_ID_HDMV_PGS_SUBTITLE,
                AV_CODEC_ID_SMPTE_KLV,    AV_CODEC_ID_TIMED_ID3}},
    {"mpeg",
     {AV_CODEC_ID_MPEG1VIDEO, AV_CODEC_ID_MPEG2VIDEO, AV_CODEC_ID_MP1, AV_CODEC_ID_MP2, AV_CODEC_ID_MP3,
      AV_CODEC_ID_AC3, AV_CODEC_ID_DTS, AV_CODEC_ID_DVD_SUBTITLE}},
    {"ogg",
     {AV_CODEC_ID_THEORA, AV_CODEC_ID_VP8, AV_CODEC_ID_VORBIS, AV_CODEC_ID_OPUS, AV_CODEC_ID_FLAC,
      AV_CODEC_ID_SPEEX}},
    {"mxf",
     {AV_CODEC_ID_MPEG2VIDEO, AV_CODEC_ID_H264, AV_CODEC_ID_DNXHD, AV_CODEC_ID_PRORES, AV_CODEC_ID_PCM_S16LE,
      AV_CODEC_ID_PCM_S24LE}},
};

bool IsOneOf(const AVOutputFormat& format, std::initializer_list<const char*> names) {
    return std::ranges::find(names, std::string(format.name)) != names.end();
}

void AddStream(AVFormatContext& container, const NewStream& added) {
    AVStream* stream = avformat_new_stream(&container, nullptr);
    if (!stream || avcodec_parameters_copy(stream->codecpar, &added.parameters) < 0) throw std::bad_alloc();
    stream->codecpar->codec_tag = 0;
    stream->time_base = added.timeBase;
    stream->disposition = added.disposition;
}

}  // namespace

const AVOutputFormat* FormatNamed(const std::string& name) {
    const AVOutputFormat* const format = av_guess_format(name.c_str(), nullptr, nullptr);
    return format ? format : av_guess_format(nullptr, ("." + name).c_str(), nullptr);
}

bool CanHold(const AVOutputFormat& format, AVCodecID codec) {
    const int known = avformat_query_codec(&format, codec, FF_COMPLIANCE_NORMAL);
    const std::string name = IsOneOf(format, {"vob", "dvd", "svcd", "vcd"}) ? "mpeg" : format.name;
    for (const ContentsRow& row : kContents) {
        if (name == row.format) return std::ranges::find(row.codecs, codec) != row.codecs.end();
    }
    return known == 1;
}

bool CanBegin(const AVFormatContext& container, const NewStream& other) {
    AVFormatContext* trial = nullptr;
    if (avformat_alloc_output_context2(&trial, container.oformat, nullptr, nullptr) < 0)
        throw std::bad_alloc();
    const std::unique_ptr<AVFormatContext, void (*)(AVFormatContext*)> owner(trial, avformat_free_context);
    for (unsigned i = 0; i < container.nb_streams; ++i) {
        const AVStream& there = *container.streams[i];
        AddStream(*trial, {*there.codecpar, there.time_base, there.disposition});
        if (i == 0) trial->streams[i]->avg_frame_rate = there.avg_frame_rate;
    }
    AddStream(*trial, other);
    int error = avio_open_dyn_buf(&trial->pb);
    if (error >= 0) error = avformat_write_header(trial, nullptr);
    std::uint8_t* bytes = nullptr;
    if (trial->pb) avio_close_dyn_buf(trial->pb, &bytes);
    av_free(bytes);
    trial->pb = nullptr;
    ThrowIfNoMemory(error);
    ForgetLibraryErrors();
    return error >= 0;
}

bool IsMovFamily(const AVOutputFormat& format) {
    return IsOneOf(format, {"mov", "mp4", "ipod", "3gp", "3g2", "psp", "ismv", "f4v"});
}

bool HoldsTurn(const AVOutputFormat& format) {
    return IsMovFamily(format);
}

bool HoldsRange(const AVOutputFormat& format, AVCodecID codec) {
    switch (codec) {
        case AV_CODEC_ID_H264:
        case AV_CODEC_ID_HEVC:
        case AV_CODEC_ID_AV1:
        case AV_CODEC_ID_VP9:
        case AV_CODEC_ID_MJPEG:
            return true;
        default:
            break;
    }
    return IsOneOf(format, {"matroska", "webm", "yuv4mpegpipe", "image2", "gif", "apng", "webp"});
}

bool HoldsOtherStreams(const AVOutputFormat& format) {
    return format.audio_codec != AV_CODEC_ID_NONE;
}

}  // namespace velmora::hosts

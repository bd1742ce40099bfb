#include "programs/reelfx/media/media_writer.h"

#include <cstring>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/pixel_converter.h"

extern "C" {
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

// The container code opens and closes image files one by one and ignores errors when closing (a full disk).
int CloseAndRemember(AVFormatContext* container, AVIOContext* file) {
    const int error = avio_close(file);
    int& remembered = *static_cast<int*>(container->opaque);
    if (error < 0 && remembered == 0) remembered = error;
    return error;
}

bool IsOldFullRangeFormat(AVPixelFormat format) {
    const char* name = av_get_pix_fmt_name(format);
    return name && std::strncmp(name, "yuvj", 4) == 0;
}

void CopySideData(const AVStream& from, AVStream& to) {
    for (int i = 0; i < from.nb_side_data; ++i) {
        const AVPacketSideData& data = from.side_data[i];
        std::uint8_t* copy = av_stream_new_side_data(&to, data.type, data.size);
        if (!copy) throw std::bad_alloc();
        std::memcpy(copy, data.data, data.size);
    }
}

}  // namespace

MediaWriter::MediaWriter(const OutputOptions& options, const std::string& address, const MediaReader& source,
                         bool withSound)
    : m_name(options.path == "-" ? "standard output" : options.path), m_source(source) {
    const std::int64_t start = source.Container().start_time;
    m_origin = start == AV_NOPTS_VALUE
                   ? source.FirstFrame().pts
                   : av_rescale_q(start, AVRational{1, AV_TIME_BASE}, source.Picture().time_base);
    const AVOutputFormat& format = ChooseContainer(options);
    AVFormatContext* container = nullptr;
    if (avformat_alloc_output_context2(&container, &format, nullptr, address.c_str()) < 0) {
        throw std::bad_alloc();
    }
    m_container.reset(container);
    m_container->opaque = &m_closeError;
    m_container->flags |= AVFMT_FLAG_BITEXACT;  // no random identifiers: the same frames give the same file
    m_container->io_close2 = CloseAndRemember;
    av_dict_copy(&m_container->metadata, source.Container().metadata, 0);
    AddPicture(options);
    if (withSound && format.audio_codec != AV_CODEC_ID_NONE) AddOtherStreams();
    // The name of a still picture is not a pattern: it holds one frame.
    char name[4096];
    m_holdsOnePicture = std::strcmp(format.name, "image2") == 0 &&
                        av_get_frame_filename(name, sizeof name, address.c_str(), 1) < 0;
}

void MediaWriter::FreeContainer::operator()(AVFormatContext* container) const {
    if (container->pb && (container->oformat->flags & AVFMT_NOFILE) == 0) avio_closep(&container->pb);
    avformat_free_context(container);
}

void MediaWriter::AddPicture(const OutputOptions& options) {
    const AVCodec& codec = ChooseCodec(options, *m_container->oformat);
    m_encoder = Allocated<CodecPtr>(avcodec_alloc_context3(&codec));
    SetUpEncoder(options, codec);
    const int error = avcodec_open2(m_encoder.get(), &codec, nullptr);
    ThrowIfNoMemory(error);
    if (error < 0) {
        throw Failure(kExitOutput, m_name + ": codec " + codec.name + " does not take frames of " +
                                       std::to_string(m_encoder->width) + "x" +
                                       std::to_string(m_encoder->height) + " " +
                                       av_get_pix_fmt_name(m_encoder->pix_fmt) + ": " + AvText(error));
    }
    m_stream = avformat_new_stream(m_container.get(), nullptr);
    if (!m_stream) throw std::bad_alloc();
    avcodec_parameters_from_context(m_stream->codecpar, m_encoder.get());
    const AVStream& from = m_source.Picture();
    m_stream->time_base = m_encoder->time_base;
    m_stream->avg_frame_rate = m_encoder->framerate;
    m_stream->sample_aspect_ratio = m_encoder->sample_aspect_ratio;
    m_stream->disposition = from.disposition;
    av_dict_copy(&m_stream->metadata, from.metadata, 0);
    CopySideData(from, *m_stream);
}

void MediaWriter::SetUpEncoder(const OutputOptions& options, const AVCodec& codec) {
    const AVFrame& first = m_source.FirstFrame();
    AVCodecContext& encoder = *m_encoder;
    encoder.width = first.width;
    encoder.height = first.height;
    encoder.pix_fmt = ChoosePixelFormat(options, codec, *m_container->oformat, first);
    encoder.sample_aspect_ratio =
        av_guess_sample_aspect_ratio(&m_source.Container(), &m_source.Picture(), nullptr);
    encoder.framerate = m_source.FrameRateGuess();
    if (codec.supported_framerates) {
        encoder.framerate =
            codec.supported_framerates[av_find_nearest_q_idx(encoder.framerate, codec.supported_framerates)];
    }
    if (codec.id == AV_CODEC_ID_MPEG4) {
        // The codec divides a second into at most 65535 parts.
        av_reduce(&encoder.framerate.num, &encoder.framerate.den, encoder.framerate.num,
                  encoder.framerate.den, 65535);
    }
    const bool isTimeless = (m_container->oformat->flags & AVFMT_NOTIMESTAMPS) != 0;
    encoder.time_base =
        isTimeless || NeedsConstantRate(codec) ? av_inv_q(encoder.framerate) : m_source.Picture().time_base;
    DescribeColours(encoder);
    if (first.interlaced_frame != 0) {
        encoder.flags |= AV_CODEC_FLAG_INTERLACED_DCT | AV_CODEC_FLAG_INTERLACED_ME;
        encoder.field_order = first.top_field_first != 0 ? AV_FIELD_TT : AV_FIELD_BB;
    }
    if ((m_container->oformat->flags & AVFMT_GLOBALHEADER) != 0) encoder.flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    // For full-range YCbCr in still pictures and for YUV4MPEG2's rarer formats.
    encoder.strict_std_compliance = FF_COMPLIANCE_UNOFFICIAL;
    SetQuality(options, codec, encoder);
}

void MediaWriter::DescribeColours(AVCodecContext& encoder) const {
    const AVFrame& first = m_source.FirstFrame();
    const bool fromRgb = IsRgb(static_cast<AVPixelFormat>(first.format));
    encoder.color_primaries = first.color_primaries;
    encoder.color_trc = first.color_trc;
    encoder.chroma_sample_location = first.chroma_location;
    if (IsRgb(encoder.pix_fmt)) {
        encoder.colorspace = AVCOL_SPC_RGB;
        encoder.color_range = AVCOL_RANGE_JPEG;
    } else if (fromRgb) {
        // There are no tags to keep: write the values in use, so that no player has to guess.
        encoder.colorspace = EffectiveMatrix(AVCOL_SPC_UNSPECIFIED, first.width, first.height);
        encoder.color_range = AVCOL_RANGE_MPEG;
    } else {
        encoder.colorspace = first.colorspace;
        encoder.color_range = first.color_range;
    }
    if (IsOldFullRangeFormat(encoder.pix_fmt) || encoder.codec_id == AV_CODEC_ID_MJPEG) {
        encoder.color_range = AVCOL_RANGE_JPEG;
    }
}

void MediaWriter::AddOtherStreams() {
    const AVFormatContext& source = m_source.Container();
    for (unsigned i = 0; i < source.nb_streams; ++i) {
        const AVStream& stream = *source.streams[i];
        const AVMediaType type = stream.codecpar->codec_type;
        if (type == AVMEDIA_TYPE_AUDIO || type == AVMEDIA_TYPE_SUBTITLE) AddOtherStream(stream);
    }
}

void MediaWriter::AddOtherStream(const AVStream& source) {
    const AVOutputFormat& format = *m_container->oformat;
    const AVCodecParameters& parameters = *source.codecpar;
    const bool isTaken = avformat_query_codec(&format, parameters.codec_id, FF_COMPLIANCE_NORMAL) == 1;
    if (!isTaken && parameters.codec_type != AVMEDIA_TYPE_AUDIO) return;
    if (isTaken && parameters.codec_type == AVMEDIA_TYPE_AUDIO && parameters.sample_rate == 0) return;
    OtherStream other;
    if (!isTaken) {
        other.transcoder = std::make_unique<SoundTranscoder>(source, format.audio_codec,
                                                             (format.flags & AVFMT_GLOBALHEADER) != 0);
    }
    other.stream = avformat_new_stream(m_container.get(), nullptr);
    if (!other.stream) throw std::bad_alloc();
    if (other.transcoder) {
        avcodec_parameters_from_context(other.stream->codecpar, &other.transcoder->Encoder());
        other.stream->time_base = other.transcoder->Encoder().time_base;
    } else {
        avcodec_parameters_copy(other.stream->codecpar, &parameters);
        other.stream->codecpar->codec_tag = 0;  // each container has its own
        other.stream->time_base = source.time_base;
        CopySideData(source, *other.stream);
    }
    other.stream->disposition = source.disposition;
    av_dict_copy(&other.stream->metadata, source.metadata, 0);
    m_others.emplace(source.index, std::move(other));
}

void MediaWriter::Rehearse(std::int64_t frames) {
    if (m_holdsOnePicture && frames > 1) FailOnePicture();
    const bool isOneFile = (m_container->oformat->flags & AVFMT_NOFILE) == 0;
    int error = isOneFile ? avio_open_dyn_buf(&m_container->pb) : 0;
    if (error >= 0) error = avformat_write_header(m_container.get(), m_options.Entries());
    if (isOneFile && m_container->pb) {
        std::uint8_t* header = nullptr;
        avio_close_dyn_buf(m_container->pb, &header);
        av_free(header);
        m_container->pb = nullptr;
    }
    if (error < 0) Fail(error);
}

std::string MediaWriter::Description() const {
    std::string text = m_name + ": " + m_container->oformat->name + ", " + m_encoder->codec->name + " " +
                       av_get_pix_fmt_name(m_encoder->pix_fmt);
    for (const auto& [index, other] : m_others) {
        const AVCodecParameters& parameters = *other.stream->codecpar;
        const char* kind = av_get_media_type_string(parameters.codec_type);
        text += std::string(", ") + (kind ? kind : "stream") + " " + avcodec_get_name(parameters.codec_id) +
                (other.transcoder ? " (encoded)" : " (copied)");
    }
    return text;
}

void MediaWriter::Begin() {
    int error = 0;
    if ((m_container->oformat->flags & AVFMT_NOFILE) == 0) {
        error = avio_open(&m_container->pb, m_container->url, AVIO_FLAG_WRITE);
    }
    if (error >= 0) error = avformat_write_header(m_container.get(), m_options.Entries());
    if (error < 0) Fail(error);
}

FramePtr MediaWriter::NewResult(const AVFrame& source) const {
    FramePtr frame = NewFrame();
    frame->width = m_encoder->width;
    frame->height = m_encoder->height;
    frame->format = m_encoder->pix_fmt;
    if (av_frame_get_buffer(frame.get(), 0) < 0 || av_frame_copy_props(frame.get(), &source) < 0) {
        throw std::bad_alloc();
    }
    frame->color_range = m_encoder->color_range;
    frame->colorspace = m_encoder->colorspace;
    frame->chroma_location = m_encoder->chroma_sample_location;
    return frame;
}

bool MediaWriter::TakesAsItIs(const AVFrame& source) const {
    return source.format == m_encoder->pix_fmt && source.width == m_encoder->width &&
           source.height == m_encoder->height && source.color_range == m_encoder->color_range &&
           source.colorspace == m_encoder->colorspace;
}

void MediaWriter::WriteFrame(FramePtr frame) {
    if (m_holdsOnePicture && m_lastPts != AV_NOPTS_VALUE) FailOnePicture();
    const AVRational base = m_source.Picture().time_base;
    frame->pts = av_rescale_q(frame->pts - m_origin, base, m_encoder->time_base);
    // With a variable frame rate, two frames may fall on the same tick of a coarser time base.
    if (m_lastPts != AV_NOPTS_VALUE && frame->pts <= m_lastPts) frame->pts = m_lastPts + 1;
    m_lastPts = frame->pts;
    m_durations[frame->pts] = av_rescale_q(frame->pkt_duration, base, m_encoder->time_base);
    frame->pict_type = AV_PICTURE_TYPE_NONE;  // the encoder decides which frames are key frames
    frame->key_frame = 0;
    Encode(frame.get());
}

void MediaWriter::Encode(const AVFrame* frame) {
    int error = avcodec_send_frame(m_encoder.get(), frame);
    if (error < 0) Fail(error);
    const PacketPtr packet = NewPacket();
    while ((error = avcodec_receive_packet(m_encoder.get(), packet.get())) >= 0) {
        const auto found = m_durations.find(packet->pts);
        if (found != m_durations.end()) {
            packet->duration = found->second;
            m_durations.erase(found);
        }
        Mux(*packet, *m_stream, m_encoder->time_base);
    }
    if (error != AVERROR(EAGAIN) && error != AVERROR_EOF) Fail(error);
}

void MediaWriter::WritePacket(const AVPacket& packet) {
    const auto found = m_others.find(packet.stream_index);
    if (found == m_others.end()) return;
    OtherStream& other = found->second;
    const AVStream& from = *m_source.Container().streams[packet.stream_index];
    const std::int64_t origin = av_rescale_q(m_origin, m_source.Picture().time_base, from.time_base);
    const PacketPtr copy = Allocated<PacketPtr>(av_packet_clone(&packet));
    if (copy->pts != AV_NOPTS_VALUE) copy->pts -= origin;
    if (copy->dts != AV_NOPTS_VALUE) copy->dts -= origin;
    copy->pos = -1;
    if (other.transcoder) {
        const AVRational base = other.transcoder->Encoder().time_base;
        other.transcoder->Send(copy.get(), [&](AVPacket& encoded) { Mux(encoded, *other.stream, base); });
    } else {
        Mux(*copy, *other.stream, from.time_base);
    }
}

void MediaWriter::Mux(AVPacket& packet, const AVStream& stream, AVRational timeBase) {
    av_packet_rescale_ts(&packet, timeBase, stream.time_base);
    packet.stream_index = stream.index;
    const int error = av_interleaved_write_frame(m_container.get(), &packet);
    if (error < 0) Fail(error);
    if (m_closeError < 0) Fail(m_closeError);
}

void MediaWriter::Finish() {
    Encode(nullptr);
    for (auto& entry : m_others) {
        auto& other = entry.second;
        if (!other.transcoder) continue;
        const AVRational base = other.transcoder->Encoder().time_base;
        other.transcoder->Send(nullptr, [&](AVPacket& encoded) { Mux(encoded, *other.stream, base); });
    }
    int error = av_write_trailer(m_container.get());
    if (error >= 0 && m_container->pb && (m_container->oformat->flags & AVFMT_NOFILE) == 0) {
        error = m_container->pb->error;
        const int closed = avio_closep(&m_container->pb);
        if (error >= 0) error = closed;
    }
    if (error >= 0) error = m_closeError;
    if (error < 0) Fail(error);
}

void MediaWriter::FailOnePicture() const {
    throw Failure(kExitUsage,
                  m_name +
                      ": can hold only one picture; use a pattern like frames-%04d.png, or select "
                      "one frame with --frames");
}

void MediaWriter::Fail(int error) const {
    ThrowIfNoMemory(error);
    throw Failure(kExitOutput, m_name + ": cannot be written: " + AvText(error));
}

}  // namespace velmora::hosts

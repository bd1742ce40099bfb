#include "programs/reelfx/media/media_writer.h"

#include <algorithm>
#include <cstring>
#include <iterator>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/container.h"
#include "programs/reelfx/media/picture_metadata.h"
#include "programs/reelfx/media/av_handles.h"

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

}  // namespace

MediaWriter::MediaWriter(const OutputOptions& options, const std::string& address, const MediaReader& source,
                         bool withOthers)
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
    m_container->strict_std_compliance = FF_COMPLIANCE_UNOFFICIAL;  // YUV4MPEG2 of more than 8 bits
    m_container->flags |= AVFMT_FLAG_BITEXACT;  // no random identifiers: the same frames give the same file
    m_container->io_close2 = CloseAndRemember;
    CopyContainerTags(source.Container(), *m_container);
    m_picture.emplace(options, format, source, m_name);
    m_stream = avformat_new_stream(m_container.get(), nullptr);
    if (!m_stream) throw std::bad_alloc();
    m_picture->Describe(*m_stream);
    CopyStreamTags(source.Picture(), *m_stream, true);
    const AVCodecContext& encoder = m_picture->Context();
    const bool isVp = encoder.codec_id == AV_CODEC_ID_VP8 || encoder.codec_id == AV_CODEC_ID_VP9;
    if (isVp && CarriesAlpha(encoder.pix_fmt)) av_dict_set(&m_stream->metadata, "alpha_mode", "1", 0);
    if (withOthers) m_others.emplace(*m_container, source, options.audio);
    // The name of a still picture is not a pattern: it holds one frame.
    char name[4096];
    const bool isImage = std::strcmp(format.name, "image2") == 0;
    m_holdsOnePicture = isImage && av_get_frame_filename(name, sizeof name, address.c_str(), 1) < 0;
    if (m_holdsOnePicture && encoder.codec_id == AV_CODEC_ID_MJPEG && !source.Exif().empty())
        m_exif = m_picture->IsUpright() ? UprightExif(source.Exif()) : source.Exif();
    if (m_picture->HasConstantRate())
        m_clock.emplace(encoder.framerate, (format.flags & AVFMT_NOTIMESTAMPS) != 0);
}

void MediaWriter::FreeContainer::operator()(AVFormatContext* container) const {
    if (container->pb && (container->oformat->flags & AVFMT_NOFILE) == 0) avio_closep(&container->pb);
    avformat_free_context(container);
}

AVRational MediaWriter::ConstantRate() const {
    return m_clock ? m_picture->Context().framerate : AVRational{0, 1};
}

void MediaWriter::CheckFrameCount(std::int64_t frames) const {
    if (m_holdsOnePicture && frames > 1) FailOnePicture();
}

void MediaWriter::Rehearse(std::int64_t frames) {
    CheckFrameCount(frames);
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
    const AVCodecContext& encoder = m_picture->Context();
    const std::string text = m_name + ": " + m_container->oformat->name + ", " + encoder.codec->name + " " +
                             av_get_pix_fmt_name(encoder.pix_fmt);
    return m_others ? text + m_others->Description() : text;
}

std::vector<std::string> MediaWriter::Notes() const {
    std::vector<std::string> notes = m_picture->Notes();
    if (m_others) std::ranges::copy(m_others->Notes(), std::back_inserter(notes));
    return notes;
}

std::vector<std::string> MediaWriter::LateNotes() const {
    std::vector<std::string> notes = m_others ? m_others->LateNotes() : std::vector<std::string>();
    if (m_clock && m_clock->Repeated() + m_clock->LeftOut() > 0) {
        notes.push_back("constant rate: " + std::to_string(m_clock->Repeated()) + " frames are repeated, " +
                        std::to_string(m_clock->LeftOut()) + " are left out");
    }
    return notes;
}

void MediaWriter::StartAt(const Section& section) {
    m_isSection = true;
    m_origin = section.pts;
    const double tick = av_q2d(m_source.Picture().time_base);
    const double first = static_cast<double>(m_source.FirstFrame().pts) * tick;
    const double begin = static_cast<double>(section.pts) * tick;
    TagSpan span = {.origin = begin, .begin = begin, .end = {}};
    if (section.endSeconds) span.end = first + *section.endSeconds;
    CopyChapters(m_source.Container(), span, *m_container);
    MoveTimecode(m_container->metadata, m_source.FrameRateGuess(), section.index);
    MoveTimecode(m_stream->metadata, m_source.FrameRateGuess(), section.index);
}

void MediaWriter::Begin() {
    if ((m_container->oformat->flags & AVFMT_NOFILE) != 0) return;
    const int error = avio_open(&m_container->pb, m_container->url, AVIO_FLAG_WRITE);
    if (error < 0) Fail(error);
    const bool canSeek = (m_container->pb->seekable & AVIO_SEEKABLE_NORMAL) != 0;
    // A file that is read while it is written has its index in pieces.
    if (!canSeek && IsMovFamily(*m_container->oformat))
        m_options.Set("movflags", "frag_keyframe+empty_moov+default_base_moof");
}

void MediaWriter::WriteHeader() {
    m_hasHeader = true;
    if (!m_isSection) {
        const double origin = static_cast<double>(m_origin) * av_q2d(m_source.Picture().time_base);
        CopyChapters(m_source.Container(), {.origin = origin, .begin = origin, .end = {}}, *m_container);
    }
    const int error = avformat_write_header(m_container.get(), m_options.Entries());
    if (error < 0) Fail(error);
    if (!m_others) return;
    m_others->WriteCovers(
        [&](AVPacket& packet, const AVStream& to, AVRational base) { Mux(packet, to, base); });
}

// In seconds, by the corrected times of the source's frames.
double MediaWriter::SecondsInOutput(std::int64_t pts) const {
    return m_source.SecondsOf(pts) - m_source.SecondsOf(m_origin);
}

void MediaWriter::WriteFrame(FramePtr frame) {
    if (!m_hasHeader) WriteHeader();
    if (m_holdsOnePicture && m_lastPts != AV_NOPTS_VALUE) FailOnePicture();
    if (m_clock) {
        const FrameClock::Step step = m_clock->Take(SecondsInOutput(frame->pts));
        Repeat(step.repeats);
        if (step.isLeftOut) return;
        m_previous = Allocated<FramePtr>(av_frame_clone(frame.get()));
        EncodeAt(*frame, m_clock->TakePlace(), 1);
        return;
    }
    const AVRational from = m_source.Picture().time_base, to = m_picture->Context().time_base;
    const std::int64_t pts = av_rescale_q(frame->pts - m_origin, from, to);
    // With a variable frame rate, two frames may fall on the same tick of a coarser time base.
    const bool isTooEarly = m_lastPts != AV_NOPTS_VALUE && pts <= m_lastPts;
    EncodeAt(*frame, isTooEarly ? m_lastPts + 1 : pts, av_rescale_q(frame->pkt_duration, from, to));
}

void MediaWriter::Repeat(std::int64_t times) {
    for (; times > 0; --times) {
        const FramePtr again = Allocated<FramePtr>(av_frame_clone(m_previous.get()));
        EncodeAt(*again, m_clock->TakePlace(), 1);
    }
}

void MediaWriter::EncodeAt(AVFrame& frame, std::int64_t pts, std::int64_t duration) {
    frame.pts = m_lastPts = pts;
    m_durations[pts] = duration;
    frame.pict_type = AV_PICTURE_TYPE_NONE;  // the encoder decides which frames are key frames
    frame.key_frame = 0;
    Encode(&frame);
}

void MediaWriter::Encode(const AVFrame* frame) {
    AVCodecContext& encoder = m_picture->Context();
    int error = avcodec_send_frame(&encoder, frame);
    if (error < 0) Fail(error);
    const PacketPtr packet = NewPacket();
    while ((error = avcodec_receive_packet(&encoder, packet.get())) >= 0) {
        const auto found = m_durations.find(packet->pts);
        if (found != m_durations.end()) {
            packet->duration = found->second;
            m_durations.erase(found);
        }
        if (m_exif.empty()) {
            Mux(*packet, *m_stream, encoder.time_base);
        } else {
            Mux(*WithExif(*packet, m_exif), *m_stream, encoder.time_base);
        }
    }
    if (error != AVERROR(EAGAIN) && error != AVERROR_EOF) Fail(error);
}

void MediaWriter::WritePacket(const AVPacket& packet) {
    if (!m_others) return;
    if (!m_hasHeader) WriteHeader();
    const AVStream& from = *m_source.Container().streams[packet.stream_index];
    const std::int64_t origin = av_rescale_q(m_origin, m_source.Picture().time_base, from.time_base);
    const PacketPtr copy = Allocated<PacketPtr>(av_packet_clone(&packet));
    if (copy->pts != AV_NOPTS_VALUE) copy->pts -= origin;
    if (copy->dts != AV_NOPTS_VALUE) copy->dts -= origin;
    copy->pos = -1;
    const double seconds = m_lastPts == AV_NOPTS_VALUE
                               ? 0.0
                               : static_cast<double>(m_lastPts) * av_q2d(m_picture->Context().time_base);
    m_others->Write(*copy, seconds,
                    [&](AVPacket& each, const AVStream& to, AVRational base) { Mux(each, to, base); });
}

void MediaWriter::Mux(AVPacket& packet, const AVStream& stream, AVRational timeBase) {
    av_packet_rescale_ts(&packet, timeBase, stream.time_base);
    packet.stream_index = stream.index;
    // Where recordings were joined, copied packets may overlap; containers want times that increase.
    const auto last = m_lastDts.find(stream.index);
    if (last != m_lastDts.end() && packet.dts != AV_NOPTS_VALUE && packet.dts <= last->second) {
        packet.dts = last->second + 1;
        if (packet.pts != AV_NOPTS_VALUE) packet.pts = std::max(packet.pts, packet.dts);
    }
    if (packet.dts != AV_NOPTS_VALUE) m_lastDts[stream.index] = packet.dts;
    const int error = av_interleaved_write_frame(m_container.get(), &packet);
    if (error < 0) Fail(error);
    if (m_closeError < 0) Fail(m_closeError);
}

void MediaWriter::Finish(std::optional<double> endSeconds) {
    if (!m_hasHeader) WriteHeader();
    if (m_clock && m_previous) {
        const double length =
            static_cast<double>(m_previous->pkt_duration) * av_q2d(m_source.Picture().time_base);
        const double end = endSeconds ? *endSeconds - m_source.SecondsOf(m_origin)
                                      : SecondsInOutput(m_previous->pts) + length;
        Repeat(m_clock->RepeatsUntil(end));
    }
    Encode(nullptr);
    if (m_others)
        m_others->Finish(
            [&](AVPacket& packet, const AVStream& to, AVRational base) { Mux(packet, to, base); });
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
    throw Failure(kExitOutput, m_name + ": cannot be written" + ErrorWords(error));
}

}  // namespace velmora::hosts

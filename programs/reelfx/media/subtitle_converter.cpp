#include "programs/reelfx/media/transcoders.h"

#include <vector>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/container.h"

namespace velmora::hosts {
namespace {

constexpr int kLongestEvent = 1 << 16;  // bytes

bool IsText(AVCodecID codec) {
    const AVCodecDescriptor* descriptor = avcodec_descriptor_get(codec);
    return descriptor && (descriptor->props & AV_CODEC_PROP_TEXT_SUB) != 0;
}

[[noreturn]] void FailToConvert() {
    throw Failure(kExitOutput,
                  "subtitles cannot be converted; use --no-sound to leave out everything but the picture");
}

}  // namespace

AVCodecID SubtitleConverter::TargetOf(const AVStream& source, const AVOutputFormat& format) {
    if (!IsText(source.codecpar->codec_id)) return AV_CODEC_ID_NONE;
    for (const AVCodecID codec :
         {AV_CODEC_ID_SUBRIP, AV_CODEC_ID_MOV_TEXT, AV_CODEC_ID_WEBVTT, AV_CODEC_ID_ASS}) {
        if (CanHold(format, codec) && avcodec_find_encoder(codec)) return codec;
    }
    return AV_CODEC_ID_NONE;
}

SubtitleConverter::SubtitleConverter(const AVStream& source, AVCodecID target)
    : m_sourceBase(source.time_base) {
    const AVCodec* from = avcodec_find_decoder(source.codecpar->codec_id);
    const AVCodec* to = avcodec_find_encoder(target);
    if (!from || !to) FailToConvert();
    m_decoder = Allocated<CodecPtr>(avcodec_alloc_context3(from));
    avcodec_parameters_to_context(m_decoder.get(), source.codecpar);
    m_decoder->pkt_timebase = source.time_base;
    if (avcodec_open2(m_decoder.get(), from, nullptr) < 0) FailToConvert();
    m_encoder = Allocated<CodecPtr>(avcodec_alloc_context3(to));
    m_encoder->time_base = kTimeBase;
    if (m_decoder->subtitle_header_size > 0) {
        const auto size = static_cast<std::size_t>(m_decoder->subtitle_header_size);
        m_encoder->subtitle_header = static_cast<std::uint8_t*>(av_mallocz(size + 1));
        if (!m_encoder->subtitle_header) throw std::bad_alloc();
        std::copy_n(m_decoder->subtitle_header, size, m_encoder->subtitle_header);
        m_encoder->subtitle_header_size = m_decoder->subtitle_header_size;
    }
    if (avcodec_open2(m_encoder.get(), to, nullptr) < 0) FailToConvert();
}

void SubtitleConverter::Send(const AVPacket& packet, const Sink& sink) {
    AVSubtitle subtitle = {};
    int isWhole = 0;
    const PacketPtr copy = Allocated<PacketPtr>(av_packet_clone(&packet));
    const int error = avcodec_decode_subtitle2(m_decoder.get(), &subtitle, &isWhole, copy.get());
    if (error < 0 || isWhole == 0) return;  // a damaged line is left out
    const std::unique_ptr<AVSubtitle, void (*)(AVSubtitle*)> owner(&subtitle, avsubtitle_free);
    if (subtitle.num_rects == 0 || packet.pts == AV_NOPTS_VALUE) return;
    const std::int64_t length =
        subtitle.end_display_time != UINT32_MAX && subtitle.end_display_time > subtitle.start_display_time
            ? subtitle.end_display_time - subtitle.start_display_time
            : av_rescale_q(packet.duration, m_sourceBase, kTimeBase);
    const std::int64_t start =
        av_rescale_q(packet.pts, m_sourceBase, kTimeBase) + subtitle.start_display_time;
    subtitle.end_display_time = static_cast<std::uint32_t>(length);
    subtitle.start_display_time = 0;
    std::vector<std::uint8_t> bytes(kLongestEvent);
    const int size = avcodec_encode_subtitle(m_encoder.get(), bytes.data(), kLongestEvent, &subtitle);
    if (size < 0) return;
    const PacketPtr encoded = NewPacket();
    if (av_new_packet(encoded.get(), size) < 0) throw std::bad_alloc();
    std::copy_n(bytes.data(), size, encoded->data);
    encoded->pts = encoded->dts = start;
    encoded->duration = length;
    encoded->flags |= AV_PKT_FLAG_KEY;
    sink(*encoded);
}

}  // namespace velmora::hosts

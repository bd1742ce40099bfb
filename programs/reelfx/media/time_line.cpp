#include "programs/reelfx/media/time_line.h"

namespace velmora::hosts {
namespace {

constexpr AVRational kBase = {1, AV_TIME_BASE};
// Streams overlap a little where recordings are joined, and pictures may stand still for seconds.
constexpr std::int64_t kBack = AV_TIME_BASE / 10;
constexpr std::int64_t kAhead = std::int64_t{10} * AV_TIME_BASE;

}  // namespace

void TimeLine::Mend(const AVFormatContext& container, AVPacket& packet) {
    if ((container.iformat->flags & AVFMT_TS_DISCONT) == 0) return;
    const AVStream& stream = *container.streams[packet.stream_index];
    const AVMediaType type = stream.codecpar->codec_type;
    // Subtitles and data come at any time.
    const bool isSteady = type == AVMEDIA_TYPE_VIDEO || type == AVMEDIA_TYPE_AUDIO;
    if (isSteady && packet.dts != AV_NOPTS_VALUE) {
        std::int64_t time = av_rescale_q(packet.dts, stream.time_base, kBase) + m_shift;
        const auto due = m_next.find(packet.stream_index);
        const std::int64_t ahead = due == m_next.end() ? 0 : time - due->second;
        if (ahead < -kBack || ahead > kAhead) {
            m_shift -= ahead;
            time -= ahead;
            m_hasJumped = true;
        }
        m_next[packet.stream_index] = time + av_rescale_q(packet.duration, stream.time_base, kBase);
    }
    const std::int64_t ticks = av_rescale_q(m_shift, kBase, stream.time_base);
    if (packet.pts != AV_NOPTS_VALUE) packet.pts += ticks;
    if (packet.dts != AV_NOPTS_VALUE) packet.dts += ticks;
}

}  // namespace velmora::hosts

#include "programs/reelfx/media/frame_times.h"

#include <algorithm>
#include <cmath>

namespace velmora::hosts {
namespace {

constexpr AVRational kBase = {1, AV_TIME_BASE};
// In AV_TIME_BASE units. Streams overlap a little where recordings are joined, and pictures may stand still for seconds.
constexpr std::int64_t kBack = AV_TIME_BASE / 10;
constexpr std::int64_t kAhead = std::int64_t{10} * AV_TIME_BASE;

// In frames. Cameras' clocks waver by up to half a frame at an even rate.
constexpr double kTolerance = 0.6;
// A gap longer than this is a fault of the times, not a picture that stands still.
constexpr double kLongestGapSeconds = 3600.0;

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

FrameClock::Step FrameClock::Take(double seconds) {
    const double due = seconds * m_rate;
    if (!m_hasBegun) {
        m_hasBegun = true;
        m_place = m_startsAtZero ? 0 : std::max<std::int64_t>(std::llround(due), 0);
        m_offset = due - static_cast<double>(m_place);
        return {0, false};
    }
    const double ahead = due - m_offset - static_cast<double>(m_place);
    if (ahead < -kTolerance) {
        ++m_leftOut;
        return {0, true};
    }
    if (ahead <= kTolerance || ahead > kLongestGapSeconds * m_rate) return {0, false};
    const std::int64_t repeats = std::llround(ahead);
    m_repeated += repeats;
    return {repeats, false};
}

std::int64_t FrameClock::RepeatsUntil(double seconds) {
    const double ahead = seconds * m_rate - m_offset - static_cast<double>(m_place);
    if (!m_hasBegun || ahead <= kTolerance || ahead > kLongestGapSeconds * m_rate) return 0;
    const std::int64_t repeats = std::llround(ahead);
    m_repeated += repeats;
    return repeats;
}

}  // namespace velmora::hosts

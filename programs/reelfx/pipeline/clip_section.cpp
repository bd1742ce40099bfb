#include "programs/reelfx/pipeline/clip_section.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"

extern "C" {
#include <libavutil/intreadwrite.h>
}

namespace velmora::hosts {
namespace {

// Users type times as decimal fractions; frame times are ticks.
constexpr double kTimeTolerance = 1e-6;
// How far sound may lag behind the picture in a file, in seconds.
constexpr double kInterleaving = 1.0;

// A jump lands at least this many frames early: some decoders lose a frame if they start at a picture that is not
// a clean starting point and the stream ends soon after it.
constexpr int kFramesAhead = 32;

}  // namespace

SectionOptions ResolveFarm(const FarmPart& farm, FrameTimes frameTimes) {
    const auto frames = static_cast<std::int64_t>(frameTimes.pts.size());
    if (frames < farm.parts) {
        throw UsageError("--farm: a clip of " + std::to_string(frames) + " frames cannot be split into " +
                         std::to_string(farm.parts) + " parts");
    }
    // Avoids a product that could overflow: each of the first parts takes one of the remaining frames.
    const std::int64_t each = frames / farm.parts, over = frames % farm.parts;
    SectionOptions section;
    section.firstFrame = each * (farm.part - 1) + std::min(over, farm.part - 1);
    if (farm.part < farm.parts) section.endFrame = each * farm.part + std::min(over, farm.part);
    section.frameTimes = std::move(frameTimes);
    return section;
}

void ResolveStart(const InputOptions& input, const MediaReader& reader, SectionOptions& section) {
    const double start = section.start.value_or(0.0);
    const bool isLate = start > 0.0 || section.firstFrame > 0;
    if (!isLate || !section.frameTimes.pts.empty() || !CanBeReadTwice(input.path)) return;
    section.frameTimes = MediaReader::TimesOf(input, section.firstFrame, start);
    const std::vector<std::int64_t>& times = section.frameTimes.pts;
    if (!section.start) return;
    const auto first = std::ranges::find_if(
        times, [&](std::int64_t pts) { return reader.SecondsOf(pts) >= start - kTimeTolerance; });
    section.firstFrame = first - times.begin();
}

ClipSection::ClipSection(MediaReader& reader, const SectionOptions& options)
    : m_reader(reader), m_options(options) {
    if (options.firstFrame > 0 && !options.frameTimes.pts.empty()) JumpToFirstFrame();
}

void ClipSection::JumpToFirstFrame() {
    const std::vector<std::int64_t>& times = m_options.frameTimes.pts;
    // Each frame must have a unique time, and the first decoded frame must be the first of these.
    const bool isClear = m_options.frameTimes.isContinuous && times.front() == m_reader.FirstFrame().pts &&
                         std::ranges::adjacent_find(times, std::ranges::equal_to()) == times.end();
    const auto goal = std::max<std::int64_t>(m_options.firstFrame - kFramesAhead, 0);
    if (!isClear || goal >= static_cast<std::int64_t>(times.size())) return;
    const auto landing = m_reader.SeekToFrame(times[static_cast<std::size_t>(goal)]);
    m_isByFrameTime = landing == MediaReader::Landing::kBefore;
    if (landing == MediaReader::Landing::kElsewhere) m_reader.Rewind();
}

PipelineItemPtr ClipSection::Next() {
    while (m_ready.empty() && !m_isOver && Interrupts() == 0) {
        MediaReader::Item item = m_reader.Next();
        if (item.frame) {
            TakeFrame(std::move(item.frame));
        } else if (item.packet) {
            TakePacket(std::move(item.packet));
        } else {
            m_isOver = true;
        }
    }
    if (m_isOver && !m_endSeconds && m_firstSeconds) EndWithClip();
    if (m_ready.empty() || Interrupts() != 0) return nullptr;
    PipelineItemPtr item = std::move(m_ready.front());
    m_ready.pop_front();
    return item;
}

bool ClipSection::IsBefore(std::int64_t index, double seconds) const {
    return index < m_options.firstFrame || seconds < m_options.start.value_or(0.0) - kTimeTolerance;
}

bool ClipSection::IsBehind(std::int64_t index, double seconds) const {
    if (m_options.endFrame && index >= *m_options.endFrame) return true;
    return m_options.duration &&
           seconds >= m_options.start.value_or(0.0) + *m_options.duration - kTimeTolerance;
}

void ClipSection::TakeFrame(FramePtr frame) {
    if (m_endSeconds) return;
    const double seconds = m_reader.SecondsOf(frame->pts);
    const std::int64_t index = IndexOf(frame->pts);
    if (IsBefore(index, seconds)) return;
    m_lastSeconds = seconds;
    if (IsBehind(index, seconds)) {
        m_endSeconds = seconds;
        m_reader.StopPicture();
        m_isOver = m_reader.Container().nb_streams == 1;
        ReleaseHeld();
        return;
    }
    auto item = std::make_unique<PipelineItem>();
    item->frame = std::move(frame);
    item->index = index;
    item->seconds = seconds;
    m_ready.push_back(std::move(item));
    if (!m_firstSeconds) m_firstSeconds = seconds;
    ReleaseHeld();
}

// The clip has ended before the section: what was held plays after the last frame.
void ClipSection::EndWithClip() {
    for (PacketPtr& packet : m_held) Put(std::move(packet));
    m_held.clear();
}

void ClipSection::ReleaseHeld() {
    std::deque<PacketPtr> held;
    held.swap(m_held);
    for (PacketPtr& packet : held) TakePacket(std::move(packet));
}

std::int64_t ClipSection::IndexOf(std::int64_t pts) {
    const std::vector<std::int64_t>& times = m_options.frameTimes.pts;
    if (m_isByFrameTime && pts <= times.back())
        m_nextIndex = std::ranges::lower_bound(times, pts) - times.begin();
    return m_nextIndex++;
}

void ClipSection::TakePacket(PacketPtr packet) {
    if (m_options.IsWholeClip()) {
        Put(std::move(packet));
        return;
    }
    const double seconds = m_reader.SecondsOf(*packet).value_or(m_lastSeconds);
    if (m_endSeconds && seconds > *m_endSeconds + kInterleaving) m_isOver = true;
    // Whether a packet is still part of the section is known only when the picture has come as far.
    const bool isBehindHeld = std::ranges::any_of(
        m_held, [&](const PacketPtr& held) { return held->stream_index == packet->stream_index; });
    if (!m_firstSeconds || (!m_endSeconds && (seconds > m_lastSeconds || isBehindHeld))) {
        m_held.push_back(std::move(packet));
        return;
    }
    if (seconds < *m_firstSeconds || (m_endSeconds && seconds >= *m_endSeconds)) return;
    Cut(*packet, seconds);
    Put(std::move(packet));
}

// Sound ends with the section's last frame, not with its own packet.
void ClipSection::Cut(AVPacket& packet, double seconds) const {
    const AVStream& stream = *m_reader.Container().streams[packet.stream_index];
    const AVCodecParameters& parameters = *stream.codecpar;
    if (!m_endSeconds || packet.duration <= 0) return;
    const double length = static_cast<double>(packet.duration) * av_q2d(stream.time_base);
    const double over = seconds + length - *m_endSeconds;
    if (over <= 0.0) return;
    packet.duration -= std::llround(over / av_q2d(stream.time_base));
    if (parameters.codec_type != AVMEDIA_TYPE_AUDIO || parameters.sample_rate <= 0) return;
    constexpr int kSkipBytes = 10;  // samples to skip at the start and at the end, and two bytes of reasons
    std::uint8_t* skip = av_packet_new_side_data(&packet, AV_PKT_DATA_SKIP_SAMPLES, kSkipBytes);
    if (!skip) throw std::bad_alloc();
    std::memset(skip, 0, kSkipBytes);
    AV_WL32(skip + 4, static_cast<std::uint32_t>(std::llround(over * parameters.sample_rate)));
}

void ClipSection::Put(PacketPtr packet) {
    auto item = std::make_unique<PipelineItem>();
    item->packet = std::move(packet);
    m_ready.push_back(std::move(item));
}

std::int64_t ClipSection::FrameCountGuess(const MediaReader& reader, const SectionOptions& options) {
    std::int64_t count = reader.FrameCountGuess();
    const double rate = av_q2d(reader.FrameRateGuess());
    if (options.endFrame) count = count > 0 ? std::min(count, *options.endFrame) : *options.endFrame;
    if (count > 0) count -= options.firstFrame;
    if (count > 0 && options.start && options.firstFrame == 0) count -= std::llround(*options.start * rate);
    if (options.duration) {
        const std::int64_t asked = std::llround(*options.duration * rate);
        count = count > 0 ? std::min(count, asked) : asked;
    }
    return std::max<std::int64_t>(count, 0);
}

}  // namespace velmora::hosts

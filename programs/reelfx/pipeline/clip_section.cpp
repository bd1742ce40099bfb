#include "programs/reelfx/pipeline/clip_section.h"

#include <algorithm>
#include <cmath>

#include "text/number_text.h"
#include "programs/reelfx/common/interrupt.h"

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

SectionOptions ResolveFarm(const FarmPart& farm, std::vector<std::int64_t> frameTimes) {
    const auto frames = static_cast<std::int64_t>(frameTimes.size());
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

ClipSection::ClipSection(MediaReader& reader, const SectionOptions& options)
    : m_reader(reader), m_options(options) {
    if (options.start && *options.start > 0.0) {
        m_hasJumped = true;
        reader.SeekBefore(std::max(0.0, *options.start - kFramesAhead / av_q2d(reader.FrameRateGuess())));
    }
    if (options.firstFrame > 0 && !options.frameTimes.empty()) JumpToFirstFrame();
}

void ClipSection::JumpToFirstFrame() {
    const std::vector<std::int64_t>& times = m_options.frameTimes;
    // Each frame must have a unique time, and the first decoded frame must be the first of these.
    const bool isClear = times.front() == m_reader.FirstFrame().pts &&
                         std::ranges::adjacent_find(times, std::ranges::equal_to()) == times.end();
    if (!isClear) return;
    const auto goal = std::max<std::int64_t>(m_options.firstFrame - kFramesAhead, 0);
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
    const std::int64_t index = IndexOf(frame->pts, seconds);
    if (IsBefore(index, seconds)) return;
    if (IsBehind(index, seconds)) {
        m_endSeconds = seconds;
        m_reader.StopPicture();
        m_isOver = m_reader.Container().nb_streams == 1;
        return;
    }
    auto item = std::make_unique<PipelineItem>();
    item->frame = std::move(frame);
    item->index = index;
    item->seconds = seconds;
    m_ready.push_back(std::move(item));
    if (m_firstSeconds) return;
    m_firstSeconds = seconds;
    for (PacketPtr& packet : m_held) TakePacket(std::move(packet));
    m_held.clear();
}

std::int64_t ClipSection::IndexOf(std::int64_t pts, double seconds) {
    if (m_isByFrameTime) {
        const std::vector<std::int64_t>& times = m_options.frameTimes;
        return std::ranges::lower_bound(times, pts) - times.begin();
    }
    // After a jump the frames before it have not been counted.
    if (m_hasJumped) return std::llround(seconds * av_q2d(m_reader.FrameRateGuess()));
    return m_nextIndex++;
}

void ClipSection::TakePacket(PacketPtr packet) {
    if (m_options.IsWholeClip()) {
        Put(std::move(packet));
        return;
    }
    if (!m_firstSeconds) {
        m_held.push_back(std::move(packet));
        return;
    }
    const double seconds = m_reader.SecondsOf(*packet).value_or(*m_firstSeconds);
    if (m_endSeconds && seconds > *m_endSeconds + kInterleaving) m_isOver = true;
    const bool isAudible = seconds >= *m_firstSeconds && (!m_endSeconds || seconds < *m_endSeconds);
    if (isAudible) Put(std::move(packet));
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
    if (count > 0 && options.start) count -= std::llround(*options.start * rate);
    if (options.duration) {
        const std::int64_t asked = std::llround(*options.duration * rate);
        count = count > 0 ? std::min(count, asked) : asked;
    }
    return std::max<std::int64_t>(count, 0);
}

}  // namespace velmora::hosts

#include "hosts/reelfx/clip_section.h"

#include <algorithm>
#include <cmath>

#include "hosts/common/usage_error.h"
#include "hosts/reelfx/interrupt.h"

namespace velmora::hosts {
namespace {

// Times that a user types are decimal fractions, those of frames are ticks.
constexpr double kTimeTolerance = 1e-6;
// How far sound may lag behind the picture in a file.
constexpr double kInterleaving = 1.0;

}  // namespace

SectionOptions ResolveFarm(const FarmPart& farm, std::int64_t frames) {
    if (frames < farm.parts) {
        throw UsageError("--farm: a clip of " + std::to_string(frames) + " frames has no " +
                         std::to_string(farm.parts) + " parts");
    }
    // Without a product that could overflow: the first parts take one of the frames that are left over.
    const std::int64_t each = frames / farm.parts, over = frames % farm.parts;
    SectionOptions section;
    section.firstFrame = each * (farm.part - 1) + std::min(over, farm.part - 1);
    if (farm.part < farm.parts) section.endFrame = each * farm.part + std::min(over, farm.part);
    return section;
}

ClipSection::ClipSection(MediaReader& reader, const SectionOptions& options)
    : m_reader(reader), m_options(options) {
    if (options.start && *options.start > 0.0) {
        m_hasJumped = true;
        reader.SeekBefore(*options.start);
    }
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
    // After a jump nobody has counted the frames.
    const std::int64_t index =
        m_hasJumped ? std::llround(seconds * av_q2d(m_reader.FrameRateGuess())) : m_nextIndex++;
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

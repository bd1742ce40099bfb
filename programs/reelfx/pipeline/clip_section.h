// The part of a clip that is rendered, as a source of pipeline items: its frames, and the packets of other
// streams that play beside them.
#pragma once

#include <cstdint>
#include <deque>
#include <optional>
#include <vector>

#include "programs/reelfx/pipeline/frame_pipeline.h"
#include "programs/reelfx/media/media_reader.h"

namespace velmora::hosts {

// One of the parts into which a clip is divided so that many machines render it.
struct FarmPart {
    std::int64_t part = 1;  // counted from 1
    std::int64_t parts = 1;
};

struct SectionOptions {
    std::int64_t firstFrame = 0;           // counted from 0
    std::optional<std::int64_t> endFrame;  // the first that is left out
    std::optional<double> start;           // seconds since the clip's first frame
    std::optional<double> duration;        // seconds
    std::optional<FarmPart> farm;          // instead of all of these; see ResolveFarm
    // Of all frames of the clip in order, where they are known: with them a section that begins late jumps to
    // its first frame instead of decoding those before it.
    std::vector<std::int64_t> frameTimes = {};

    [[nodiscard]] bool IsWholeClip() const { return firstFrame == 0 && !endFrame && !start && !duration; }
};

// The frames of a part of a clip with frames at these times (MediaReader::FrameTimes). The parts lie side by
// side, the last one goes to the clip's end. Throws UsageError when there are more parts than frames.
SectionOptions ResolveFarm(const FarmPart& farm, std::vector<std::int64_t> frameTimes);

class ClipSection {
  public:
    // `reader` stands at its start and outlives the section. Jumps ahead where a start is given.
    ClipSection(MediaReader& reader, const SectionOptions& options);

    // Null at the section's end and when the user interrupts. Unless the section is the whole clip, the first
    // item is a frame, and packets that lie before it are left out.
    PipelineItemPtr Next();

    // Frames read so far, those before the section too; 0 after a jump.
    [[nodiscard]] std::int64_t FramesCounted() const { return m_nextIndex; }

    // Frames that will come, as far as can be told; 0 when it cannot.
    [[nodiscard]] static std::int64_t FrameCountGuess(const MediaReader& reader,
                                                      const SectionOptions& options);

  private:
    void JumpToFirstFrame();
    void TakeFrame(FramePtr frame);
    [[nodiscard]] std::int64_t IndexOf(std::int64_t pts, double seconds);
    void TakePacket(PacketPtr packet);
    [[nodiscard]] bool IsBefore(std::int64_t index, double seconds) const;
    [[nodiscard]] bool IsBehind(std::int64_t index, double seconds) const;
    void Put(PacketPtr packet);

    MediaReader& m_reader;
    SectionOptions m_options;
    std::deque<PipelineItemPtr> m_ready;
    std::deque<PacketPtr> m_held;          // packets before the first frame
    std::optional<double> m_firstSeconds;  // of the first frame in the section
    std::optional<double> m_endSeconds;    // set when the section's last frame has come
    std::int64_t m_nextIndex = 0;
    bool m_hasJumped = false;      // by time
    bool m_isByFrameTime = false;  // has jumped to a frame
    bool m_isOver = false;
};

}  // namespace velmora::hosts

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

// One of the parts into which a clip is divided so that many machines can render it.
struct FarmPart {
    std::int64_t part = 1;  // counted from 1
    std::int64_t parts = 1;
};

struct SectionOptions {
    std::int64_t firstFrame = 0;           // counted from 0
    std::optional<std::int64_t> endFrame;  // the first frame after the section
    std::optional<double> start;           // seconds since the clip's first frame
    std::optional<double> duration;        // seconds
    std::optional<FarmPart> farm;          // instead of all of these; see ResolveFarm
    // The times of the clip's frames, at least of those up to the section's first, if known: a section that begins
    // late then jumps to its first frame instead of decoding those before it.
    FrameTimes frameTimes = {};

    [[nodiscard]] bool IsWholeClip() const { return firstFrame == 0 && !endFrame && !start && !duration; }
};

// The frames of one part of a clip with frames at these times (MediaReader::FrameTimes). The parts are
// adjacent, and the last one goes to the end of the clip. Throws UsageError when there are more parts than
// frames.
SectionOptions ResolveFarm(const FarmPart& farm, FrameTimes frameTimes);

// Finds the number of the section's first frame if the section begins later than the clip, so that frames have the
// same numbers however the section was asked for. Leaves `section` as it is if the input can be read only once; the
// frames are then counted while they are read. `reader` has the input open.
void ResolveStart(const InputOptions& input, const MediaReader& reader, SectionOptions& section);

class ClipSection {
  public:
    // `reader` is at its start and outlives the section. Jumps ahead if the frames' times are known.
    ClipSection(MediaReader& reader, const SectionOptions& options);

    // Null at the end of the section and when the user interrupts. Unless the section is the whole clip, the
    // first item is a frame, and earlier packets are dropped.
    PipelineItemPtr Next();

    // When the frame after the section comes, in seconds; nothing if the clip ended before.
    [[nodiscard]] std::optional<double> EndSeconds() const { return m_endSeconds; }

    // Frames read so far, including those before the section; 0 after a jump.
    [[nodiscard]] std::int64_t FramesCounted() const { return m_nextIndex; }

    // The expected number of frames; 0 if unknown.
    [[nodiscard]] static std::int64_t FrameCountGuess(const MediaReader& reader,
                                                      const SectionOptions& options);

  private:
    void JumpToFirstFrame();
    void TakeFrame(FramePtr frame);
    [[nodiscard]] std::int64_t IndexOf(std::int64_t pts);
    void TakePacket(PacketPtr packet);
    [[nodiscard]] bool IsBefore(std::int64_t index, double seconds) const;
    [[nodiscard]] bool IsBehind(std::int64_t index, double seconds) const;
    void ReleaseHeld();
    void EndWithClip();
    void Cut(AVPacket& packet, double seconds) const;
    void Put(PacketPtr packet);

    MediaReader& m_reader;
    SectionOptions m_options;
    std::deque<PipelineItemPtr> m_ready;
    std::deque<PacketPtr> m_held;          // packets that play after the last frame read so far
    std::optional<double> m_firstSeconds;  // of the first frame in the section
    double m_lastSeconds = 0.0;            // of the last frame read
    std::optional<double> m_endSeconds;    // set after the section's last frame
    std::int64_t m_nextIndex = 0;
    bool m_isByFrameTime = false;  // has jumped to a frame
    bool m_isOver = false;
};

}  // namespace velmora::hosts

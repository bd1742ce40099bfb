// Times that are not what an output needs: clocks that jump, and frames at uneven times.
#pragma once

#include <cstdint>
#include <map>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// Times of packets where a stream's clock jumps: recordings that were joined, or a transmitter that started again.
// Each packet then follows the one before it.
class TimeLine {
  public:
    // Changes the packet's times if the clock has jumped. Only formats whose clock may jump are looked at.
    void Mend(const AVFormatContext& container, AVPacket& packet);
    // After a jump in the file.
    void Forget() { m_next.clear(); }
    [[nodiscard]] bool HasJumped() const { return m_hasJumped; }

  private:
    std::int64_t m_shift = 0;            // in AV_TIME_BASE units, as all times here
    std::map<int, std::int64_t> m_next;  // when a stream's next packet is due
    bool m_hasJumped = false;
};

// Frames at a constant rate out of frames at any times: which are repeated, and which are left out.
class FrameClock {
  public:
    // With `startsAtZero` the first frame is the first of the output; otherwise it keeps its time.
    FrameClock(AVRational rate, bool startsAtZero) : m_rate(av_q2d(rate)), m_startsAtZero(startsAtZero) {}

    struct Step {
        std::int64_t repeats;  // how often the frame before this one is written again
        bool isLeftOut;        // this frame has no place
    };
    // For the next frame in order, at this time.
    Step Take(double seconds);
    // How often the last frame is written again if the film ends at this time.
    std::int64_t RepeatsUntil(double seconds);

    // The place of the next frame that is written.
    std::int64_t TakePlace() { return m_place++; }

    [[nodiscard]] std::int64_t Repeated() const { return m_repeated; }
    [[nodiscard]] std::int64_t LeftOut() const { return m_leftOut; }

  private:
    double m_rate;
    bool m_startsAtZero;
    bool m_hasBegun = false;
    double m_offset = 0.0;  // of the first frame from its place
    std::int64_t m_place = 0;
    std::int64_t m_repeated = 0, m_leftOut = 0;
};

}  // namespace velmora::hosts

// Times of packets where a stream's clock jumps: recordings that were joined, or a transmitter that started again.
// Each packet then follows the one before it.
#pragma once

#include <cstdint>
#include <map>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

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

}  // namespace velmora::hosts

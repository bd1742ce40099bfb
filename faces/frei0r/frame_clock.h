// From the time that a host passes to the clip's time that an effect renders.
//
// Unit. What the calling module is known to use (host_time_unit.h) or what is written behind the frame rate
// ("25 ms", "25 s"). Of an unknown host: seconds, as frei0r's header says, until a step between two times that
// follow each other is half a frame in milliseconds or longer (half a frame of 120 a second when no rate is
// given). No host of a clip steps by so many seconds without a jump.
//
// Frame. With a frame rate the frame is the nearest one, times of containers being rounded to anything down to a
// millisecond, and the clip's time is (start frame + frame) / rate: what a clip of constant rate says itself.
// Without one the host's time is taken as it is, and the start frame counts in 30ths of a second.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

#include "text/number_text.h"
#include "faces/frei0r/host_time_unit.h"

namespace velmora::hosts::frei0r {

class FrameClock {
  public:
    explicit FrameClock(TimeUnit hostUnit) noexcept : m_unit(hostUnit) {}

    // "25", "29.97", "30000/1001", each with "ms" or "s" behind it or not. Anything else: as if not given.
    void SetFrameRate(std::string_view text) noexcept;
    void SetStartFrame(std::int64_t frame) noexcept { m_startFrame = frame; }

    // Seconds from the start of the clip. A time that is not a number counts as 0.
    [[nodiscard]] double ClipSeconds(double hostTime) noexcept;

  private:
    [[nodiscard]] bool IsMilliseconds(double hostTime) noexcept;

    TimeUnit m_unit;                           // of the host, as far as it is known
    TimeUnit m_toldUnit = TimeUnit::kUnknown;  // behind the frame rate
    std::optional<FrameRate> m_rate;
    std::int64_t m_startFrame = 0;
    std::optional<double> m_lastTime;
};

}  // namespace velmora::hosts::frei0r

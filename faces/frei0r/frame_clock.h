// From the time that a host passes to the clip's time that an effect renders.
//
// Unit. What the calling module is known to use (UnitOfModule) or what is written behind the frame rate
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

namespace velmora::hosts::frei0r {

// In which unit a host gives times. Frei0r's header says seconds, FFmpeg gives milliseconds. The values do not
// tell: 40 is the second frame of a clip of 25 frames a second in milliseconds and its thousandth in seconds. So the
// module that calls the plug-in is asked for its name.
enum class TimeUnit : std::uint8_t { kUnknown, kSeconds, kMilliseconds };

// By a module's file name, with or without folder: milliseconds for libavfilter and for FFmpeg's own programs,
// which may have it linked in; seconds for MLT's and GStreamer's frei0r modules.
[[nodiscard]] TimeUnit UnitOfModule(std::string_view fileName);

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

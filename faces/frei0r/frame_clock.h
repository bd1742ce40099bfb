// Converts the time that a host passes to the clip time that an effect renders.
//
// Unit. Written after the frame rate ("25 ms", "25 s"), or known from the calling module (UnitOfModule).
// For an unknown host it is seconds, as frei0r's header says, until two consecutive times differ by at least
// half a frame in milliseconds (half a frame at 120 per second if no rate is given). A host playing a clip
// never advances by so many seconds.
//
// Frame. If a frame rate is given, the time is rounded to the nearest frame, because containers may round
// times to milliseconds, and the clip's time is (start frame + frame) / rate. Without it the host's time is
// used as it is, and the start frame counts in 30ths of a second.
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

    // "25", "29.97", "30000/1001", optionally followed by "ms" or "s". Anything else counts as not given; false for what
    // is neither empty nor "none".
    bool SetFrameRate(std::string_view text) noexcept;
    void SetStartFrame(std::int64_t frame) noexcept { m_startFrame = frame; }

    // Seconds from the start of the clip. A time that is not a number counts as 0.
    [[nodiscard]] double ClipSeconds(double hostTime) noexcept;

  private:
    [[nodiscard]] bool IsMilliseconds(double hostTime) noexcept;

    TimeUnit m_unit;                           // the host's unit, as far as it is known
    TimeUnit m_toldUnit = TimeUnit::kUnknown;  // written after the frame rate
    std::optional<FrameRate> m_rate;
    std::int64_t m_startFrame = 0;
    std::optional<double> m_lastTime;
};

}  // namespace velmora::hosts::frei0r

// Which frame of a clip is due, and how its time is displayed.
#pragma once

#include <cstdint>
#include <string>

#include "text/number_text.h"

namespace velmora::reelview {

class Transport {
  public:
    // Stops and goes to the first frame. `frames` is at least 1.
    void Open(std::int64_t frames, hosts::FrameRate rate);

    [[nodiscard]] std::int64_t Frames() const { return m_frames; }
    [[nodiscard]] std::int64_t Frame() const { return m_frame; }
    [[nodiscard]] bool IsPlaying() const { return m_isPlaying; }
    [[nodiscard]] bool Loops() const { return m_loops; }
    [[nodiscard]] hosts::FrameRate Rate() const { return m_rate; }
    [[nodiscard]] double Seconds() const { return m_rate.SecondsAt(m_frame); }

    void SetLoop(bool loops) { m_loops = loops; }
    // `now` is any steady clock in seconds. Playing from the last frame starts over.
    void Play(double now);
    void Pause() { m_isPlaying = false; }
    // Clamped to the clip; playback continues from there.
    void GoTo(std::int64_t frame, double now);
    void Step(std::int64_t by);
    // True when another frame is due. At the end, playback starts over or, without loop, stops at the last frame.
    bool Advance(double now);

  private:
    std::int64_t m_frames = 1, m_frame = 0, m_startFrame = 0;
    hosts::FrameRate m_rate = {25, 1};
    double m_startTime = 0.0;
    bool m_isPlaying = false, m_loops = true;
};

// "00:01:02.345"
[[nodiscard]] std::string TimeText(double seconds);

}  // namespace velmora::reelview

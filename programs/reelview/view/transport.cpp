#include "programs/reelview/view/transport.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

namespace velmora::reelview {

void Transport::Open(std::int64_t frames, hosts::FrameRate rate) {
    m_frames = std::max<std::int64_t>(frames, 1);
    m_rate = rate.numerator > 0 && rate.denominator > 0 ? rate : hosts::FrameRate{25, 1};
    m_frame = 0;
    m_isPlaying = false;
}

void Transport::Play(double now) {
    if (m_frames < 2) return;
    if (m_frame == m_frames - 1) m_frame = 0;
    m_isPlaying = true;
    m_startTime = now;
    m_startFrame = m_frame;
}

void Transport::GoTo(std::int64_t frame, double now) {
    m_frame = std::clamp<std::int64_t>(frame, 0, m_frames - 1);
    m_startTime = now;
    m_startFrame = m_frame;
}

void Transport::Step(std::int64_t by) {
    Pause();
    m_frame = std::clamp<std::int64_t>(m_frame + by, 0, m_frames - 1);
}

bool Transport::Advance(double now) {
    if (!m_isPlaying) return false;
    const double elapsed = std::max(now - m_startTime, 0.0);
    const auto passed =
        static_cast<std::int64_t>(std::floor(elapsed * m_rate.numerator / m_rate.denominator + 1e-9));
    std::int64_t due = m_startFrame + passed;
    if (due >= m_frames) {
        if (m_loops) {
            due %= m_frames;
        } else {
            due = m_frames - 1;
            Pause();
        }
    }
    if (due == m_frame) return false;
    m_frame = due;
    return true;
}

std::string TimeText(double seconds) {
    const auto milliseconds = static_cast<long long>(std::floor(std::max(seconds, 0.0) * 1000.0 + 0.5));
    char text[40];
    std::snprintf(text, sizeof text, "%02lld:%02lld:%02lld.%03lld", milliseconds / 3600000,
                  milliseconds / 60000 % 60, milliseconds / 1000 % 60, milliseconds % 1000);
    return text;
}

}  // namespace velmora::reelview

#include "programs/reelfx/media/frame_clock.h"

#include <algorithm>
#include <cmath>

namespace velmora::hosts {
namespace {

// In frames. Cameras' clocks waver by up to half a frame at an even rate.
constexpr double kTolerance = 0.6;
// A gap longer than this is a fault of the times, not a picture that stands still.
constexpr double kLongestGapSeconds = 3600.0;

}  // namespace

FrameClock::Step FrameClock::Take(double seconds) {
    const double due = seconds * m_rate;
    if (!m_hasBegun) {
        m_hasBegun = true;
        m_place = m_startsAtZero ? 0 : std::max<std::int64_t>(std::llround(due), 0);
        m_offset = due - static_cast<double>(m_place);
        return {0, false};
    }
    const double ahead = due - m_offset - static_cast<double>(m_place);
    if (ahead < -kTolerance) {
        ++m_leftOut;
        return {0, true};
    }
    if (ahead <= kTolerance || ahead > kLongestGapSeconds * m_rate) return {0, false};
    const std::int64_t repeats = std::llround(ahead);
    m_repeated += repeats;
    return {repeats, false};
}

std::int64_t FrameClock::RepeatsUntil(double seconds) {
    const double ahead = seconds * m_rate - m_offset - static_cast<double>(m_place);
    if (!m_hasBegun || ahead <= kTolerance || ahead > kLongestGapSeconds * m_rate) return 0;
    const std::int64_t repeats = std::llround(ahead);
    m_repeated += repeats;
    return repeats;
}

}  // namespace velmora::hosts

#include "programs/reelview/panel/knob.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace velmora::reelview {
namespace {

constexpr double kFine = 0.1, kStep = 0.01, kPage = 0.1;
// Closer to the centre the angle is meaningless.
constexpr double kDeadRadius = 3.0;

double Held(double value) {
    return std::clamp(value, 0.0, 1.0);
}

double Degrees(double x, double y) {
    return std::atan2(x, -y) * 180.0 / std::numbers::pi;
}

}  // namespace

double KnobAngle(double value) {
    return (Held(value) - 0.5) * kKnobSweepDegrees;
}

void KnobDrag::Begin(DragWay way, double value, double x, double y, double travel) {
    m_way = way;
    m_value = Held(value);
    m_x = x;
    m_y = y;
    m_travel = std::max(travel, 1.0);
}

double KnobDrag::Way(double x, double y) const {
    if (m_way == DragWay::kVertical) return (m_y - y) / m_travel;
    if (m_way == DragWay::kHorizontal) return (x - m_x) / m_travel;
    if (std::hypot(x, y) < kDeadRadius || std::hypot(m_x, m_y) < kDeadRadius) return 0.0;
    // Takes the shorter way round, so that a drag through the gap at the bottom does not jump from one end to the
    // other.
    return std::remainder(Degrees(x, y) - Degrees(m_x, m_y), 360.0) / kKnobSweepDegrees;
}

double KnobDrag::Move(double x, double y, bool isFine) {
    m_value = Held(m_value + Way(x, y) * (isFine ? kFine : 1.0));
    m_x = x;
    m_y = y;
    return m_value;
}

double AfterKey(double value, KnobKey key, bool isFine) {
    const double step = isFine ? kStep * kFine : kStep;
    switch (key) {
        case KnobKey::kUp:
            return Held(value + step);
        case KnobKey::kDown:
            return Held(value - step);
        case KnobKey::kPageUp:
            return Held(value + kPage);
        case KnobKey::kPageDown:
            return Held(value - kPage);
        case KnobKey::kHome:
            return 0.0;
        case KnobKey::kEnd:
            return 1.0;
    }
    return value;
}

double AfterWheel(double value, double notches, bool isFine) {
    return Held(value + notches * (isFine ? kStep * kFine : kStep));
}

}  // namespace velmora::reelview

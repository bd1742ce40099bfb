// Knobs without windows: how they turn, and how they look.
#pragma once

#include <cstdint>

#include "programs/reelview/base/picture.h"

namespace velmora::reelview {

inline constexpr double kKnobSweepDegrees = 270.0;

// Degrees clockwise from straight up: -135..135.
[[nodiscard]] double KnobAngle(double value);

enum class DragWay { kCircle, kVertical, kHorizontal };

class KnobDrag {
  public:
    // The mouse position is in pixels relative to the knob's centre, y down. `travel` is the length in pixels of a
    // straight drag through the whole range, at least 1.
    void Begin(DragWay way, double value, double x, double y, double travel);
    // The value for the new mouse position; a fine drag moves a tenth as far.
    double Move(double x, double y, bool isFine);

  private:
    [[nodiscard]] double Way(double x, double y) const;

    DragWay m_way = DragWay::kCircle;
    double m_value = 0.0, m_x = 0.0, m_y = 0.0, m_travel = 1.0;
};

enum class KnobKey { kUp, kDown, kPageUp, kPageDown, kHome, kEnd };

// Normal steps are a hundredth of the range, fine steps a thousandth, pages a tenth.
[[nodiscard]] double AfterKey(double value, KnobKey key, bool isFine);
// `notches` is positive away from the user.
[[nodiscard]] double AfterWheel(double value, double notches, bool isFine);

struct KnobLook {
    double value = 0.0;   // 0..1
    double origin = 0.0;  // where the coloured arc starts: 0, or where the displayed value is 0
    bool hasFocus = false, isEnabled = true;
};

// A round knob as pixels, antialiased. `side` is the square's width in pixels, at least 8.
[[nodiscard]] Picture DrawKnob(std::int32_t side, const KnobLook& look, const KnobColours& colours);

}  // namespace velmora::reelview

// A setting as a user writes it, which may change over time:
//
//   "Wear=10"             always 10
//   "Wear=10@0 60@125"    10 in frame 0, 60 in frame 125
//   "Wear=10@0 60@5s"     the same at 25 frames per second: 5 s after the first frame
//
// Frames and times are those of the clip, also where only a part of it is rendered. Before the first point and after
// the last their values are held. Between two points sliders and colours change evenly; a menu or a check box keeps
// the value of the earlier one.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "programs/common/settings.h"

namespace velmora::hosts {

// A frame of a clip.
struct ClipPlace {
    std::int64_t frame = 0;  // counted from 0
    double seconds = 0.0;    // since the clip's first frame
};

class TimedSetting {
  public:
    // Throws UsageError as ParseSetting does, and for points that are out of order or of different units.
    TimedSetting(const EffectInfo& effect, std::string_view text);

    [[nodiscard]] std::uint32_t Parameter() const { return m_parameter; }
    [[nodiscard]] bool Fades() const { return m_points.size() > 1; }
    [[nodiscard]] ValueWord At(const ClipPlace& place) const;
    // The values at the points; the one at most points that a slider or switch reaches.
    [[nodiscard]] std::vector<ValueWord> Values() const;
    [[nodiscard]] ValueWord Largest() const;
    // As a user would write it, without the name: "10@0 60@5s".
    [[nodiscard]] std::string Text(const ParamInfo& param) const;

  private:
    struct Point {
        double position;  // in frames or seconds
        ValueWord value;
        double shown;  // of a slider, before it is narrowed
    };

    void AddPoints(const EffectInfo& effect, std::string_view name, std::string_view text);

    std::uint32_t m_parameter = 0;
    std::uint32_t m_kind = 0;  // ParamKind
    SliderRange m_range;
    bool m_isInSeconds = false;
    std::vector<Point> m_points;  // one at least, in order
};

}  // namespace velmora::hosts

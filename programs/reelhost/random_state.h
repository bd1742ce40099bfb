// Finds out where the library's random sequence stands, so that another host can play the same damage.
//
// The sequence begins with the system's tick count while the library is loaded; the library does not tell it.
// A few frames with the strongest jitter show pairs of numbers drawn; of the states that are possible only
// one draws them all.
#pragma once

#include <cstdint>

#include "programs/common/effect_library.h"
#include "programs/common/effect_run.h"

namespace velmora::hosts {

class RandomStateFinder {
  public:
    explicit RandomStateFinder(const EffectLibrary& library);

    // The state that the next frame starts from, provided its frame number is below a million. Moves the
    // sequence on by a few draws. Throws std::runtime_error when no state fits.
    std::uint32_t Find();

  private:
    struct Shift {
        std::int32_t down, right;
    };

    Shift Probe();

    EffectRun m_camera;
    std::uint32_t m_tickBefore, m_tickAfter;
    std::uint32_t m_lastState = 0;
    bool m_isFound = false;
    std::int64_t m_probes = 0;
};

}  // namespace velmora::hosts

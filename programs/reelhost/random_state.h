// Finds the current state of the library's random sequence, so that another host can render the same damage.
//
// The sequence is seeded with the system's tick count when the library is loaded, and the library does not expose it.
// A few frames with the strongest jitter reveal pairs of drawn numbers; only one of the possible states draws them
// all.
#pragma once

#include <cstdint>

#include "programs/common/effect_library.h"
#include "programs/common/effect_run.h"

namespace velmora::hosts {

class RandomStateFinder {
  public:
    explicit RandomStateFinder(const EffectLibrary& library);

    // The state that the next frame starts from, provided its frame number is below a million. Advances the sequence
    // by a few draws. Throws std::runtime_error when no state fits.
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

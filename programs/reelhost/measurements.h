// What reelhost measures of a loaded library: what a frame costs compared with a memcpy of it (bench.cpp), whether an
// hour of film costs as much at the end as at the beginning (soak.cpp), and the state of its random sequence.
#pragma once

#include <cstdint>

#include "programs/common/effect_library.h"
#include "programs/common/effect_run.h"

namespace velmora::hosts {

// Prints a Markdown table to standard output. Throws std::runtime_error when an effect refuses a frame.
void PrintBench(const EffectLibrary& library);

// Renders at least `frames` frames of 1920x1080 at 30 frames per second, in rounds through every preset of every
// effect, each with its own effect object. After each round, prints what the process holds and what a frame costs;
// the last line is a verdict. True when memory and handles did not grow and, in a run of 16 or more rounds, neither
// did the cost. Throws std::runtime_error when an effect refuses a frame.
bool RunSoak(const EffectLibrary& library, std::int64_t frames);

// Finds the current state of the library's random sequence, so that another host can render the same damage.
//
// The sequence is seeded with the system's tick count when the library is loaded, and the library does not expose it.
// A few frames with the strongest jitter reveal pairs of drawn numbers; only one of the possible states draws them
// all.
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

// What a frame costs through the DLL compared with a memcpy of it (bench.cpp), and whether an hour of film through
// one loaded library costs as much at the end as at the beginning (soak.cpp).
#pragma once

#include <cstdint>

#include "programs/common/effect_library.h"

namespace velmora::hosts {

// Prints a Markdown table to standard output. Throws std::runtime_error when an effect refuses a frame.
void PrintBench(const EffectLibrary& library);

// Renders at least `frames` frames of 1920x1080 at 30 frames per second, in rounds through every preset of every
// effect, each with its own effect object. After each round, prints what the process holds and what a frame costs;
// the last line is a verdict. True when memory and handles did not grow and, in a run of 16 or more rounds, neither
// did the cost. Throws std::runtime_error when an effect refuses a frame.
bool RunSoak(const EffectLibrary& library, std::int64_t frames);

}  // namespace velmora::hosts

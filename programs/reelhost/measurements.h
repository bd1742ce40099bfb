// What a frame costs through the DLL, beside a memcpy of one (bench.cpp); and whether an hour of film through one loaded
// library costs at the end what it cost at the beginning (soak.cpp).
#pragma once

#include <cstdint>

#include "programs/common/effect_library.h"

namespace velmora::hosts {

// Prints a Markdown table to standard output. Throws std::runtime_error when an effect refuses a frame.
void PrintBench(const EffectLibrary& library);

// Renders at least `frames` frames of 1920x1080, 30 to the second of film, in rounds through every preset of every
// effect, each with an effect object of its own. Prints what the process holds and what a frame costs after each
// round, and a verdict in the last line. True when memory, handles and, in a run of 16 rounds and more, cost stayed
// where they were. Throws std::runtime_error when an effect refuses a frame.
bool RunSoak(const EffectLibrary& library, std::int64_t frames);

}  // namespace velmora::hosts

// What a frame costs through the DLL, beside a memcpy of one.
#pragma once

#include "programs/common/effect_library.h"

namespace velmora::hosts {

// Prints a Markdown table to standard output. Throws std::runtime_error when an effect refuses a frame.
void PrintBench(const EffectLibrary& library);

}  // namespace velmora::hosts

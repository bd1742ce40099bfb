// The library with one fault of choice: what reelcheck must find. The fault is named in REELCHECK_FAULT.
#pragma once

#include "api/host_api.h"

namespace velmora::testing {

// Wraps a library object, whose reference it takes.
[[nodiscard]] IEffectLibrary* MakeFaulty(IEffectLibrary* library);
[[nodiscard]] bool FaultIs(const char* name);

}  // namespace velmora::testing

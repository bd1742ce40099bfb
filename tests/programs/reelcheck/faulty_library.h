// The library with one chosen fault that reelcheck must find. REELCHECK_FAULT names the fault.
#pragma once

#include "api/host_api.h"

namespace velmora::testing {

// Wraps a library object and takes over its reference.
[[nodiscard]] IEffectLibrary* MakeFaulty(IEffectLibrary* library);
[[nodiscard]] bool FaultIs(const char* name);

}  // namespace velmora::testing

// The loaded library itself and its two exports.
#pragma once

#include "api/host_api.h"
#include "platform/platform.h"

namespace velmora {

// The module that this code lies in, for finding the files beside it; null in a native program.
[[nodiscard]] support::ModuleHandle ModuleHandle() noexcept;
// Called by the module entry when a process attaches the library.
void SetModuleHandle(support::ModuleHandle module) noexcept;

}  // namespace velmora

extern "C" {
velmora::IEffectLibrary* VM_CALL GetEffectsLibrary();
bool VM_CALL CanUnloadDLLNow();
}

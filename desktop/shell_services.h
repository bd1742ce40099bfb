// The process-wide shell services and how the library objects take part in them.
#pragma once

#include "api/host_api.h"
#include "platform/platform.h"

namespace velmora::support {

// Valid as long as the process, or the library, is loaded.
[[nodiscard]] IShellServices& ShellServices() noexcept;

// A library object was made: offers it as source of translated texts, without a reference, and starts the services
// when they are not started.
void OfferTextSource(ModuleHandle module, com::IUnknown* library, const char* helpFileName) noexcept;

// A library object goes: another living one, if any, is asked for texts from now on. With the last one the services
// shut down, so that the library can be unloaded; the next library object starts them again.
void WithdrawTextSource(com::IUnknown* library) noexcept;

}  // namespace velmora::support

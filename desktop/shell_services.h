// The process-wide shell services and how library objects use them.
#pragma once

#include "api/host_api.h"
#include "platform/platform.h"

namespace velmora::support {

// Valid as long as the process, or the library, is loaded.
[[nodiscard]] IShellServices& ShellServices() noexcept;

// Call when a library object is created: offers it as a source of translated texts, without taking a reference, and
// starts the services if they are not running.
void OfferTextSource(ModuleHandle module, com::IUnknown* library, const char* helpFileName) noexcept;

// Call when a library object is destroyed: from then on another live one, if any, supplies texts. With the last one the
// services shut down, so that the library can be unloaded; the next library object starts them again.
void WithdrawTextSource(com::IUnknown* library) noexcept;

}  // namespace velmora::support

// For the entry of a module that may be unloaded while the process goes on. Windows only.
#pragma once

#include <windows.h>

extern "C" const IMAGE_TLS_DIRECTORY _tls_used;  // the module's own, made by the linker

namespace velmora::support {

// Call at DLL_PROCESS_DETACH. The C++ runtime that is linked into the module keeps two handles for the thread that
// first used it and gives them back when that thread ends, but not when the module goes before: a host that
// loads and unloads the library again and again would lose two handles each time. So the runtime is told that the
// unloading thread ends, which for the module is true. `reserved` is the entry's last argument: not null when the
// whole process ends, and then nothing has to be done.
inline void ReleaseRuntimeOfThread(HINSTANCE module, void* reserved) noexcept {
    if (reserved != nullptr) return;
    const auto* callback = reinterpret_cast<const PIMAGE_TLS_CALLBACK*>(_tls_used.AddressOfCallBacks);
    for (; callback != nullptr && *callback != nullptr; ++callback) {
        (*callback)(module, DLL_THREAD_DETACH, nullptr);
    }
}

}  // namespace velmora::support

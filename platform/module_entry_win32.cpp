// The entry point of a module that may be unloaded while the process runs on, as all of ours may.

#include <windows.h>

extern "C" const IMAGE_TLS_DIRECTORY _tls_used;  // the module's own, made by the linker

namespace __gnu_cxx {
void __freeres();  // from the C++ runtime; no header declares it
}

namespace {

// The C++ runtime linked into a module keeps handles for each thread that uses it. It releases them when that thread
// ends, but not when the module is unloaded first: a host that loads and unloads the library repeatedly would leak some
// each time. So the runtime is notified that the unloading thread ends, which is true as far as the module is
// concerned.
class RuntimeRelease {
  public:
    // Call at DLL_PROCESS_DETACH. `reserved` is the entry point's last argument; it is not null when the whole process
    // ends, and then nothing needs to be done.
    void Arm(HINSTANCE module, const void* reserved) noexcept {
        m_module = reserved == nullptr ? module : nullptr;
    }
    ~RuntimeRelease() {
        if (m_module == nullptr) return;
        const auto* callback = reinterpret_cast<const PIMAGE_TLS_CALLBACK*>(_tls_used.AddressOfCallBacks);
        for (; callback != nullptr && *callback != nullptr; ++callback) {
            (*callback)(m_module, DLL_THREAD_DETACH, nullptr);
        }
        // The runtime's emergency memory for throwing exceptions when there is not enough memory.
        __gnu_cxx::__freeres();
    }

  private:
    HINSTANCE m_module = nullptr;
};

// Constructed before, and so destroyed after, everything else in the module, which may still use the runtime.
__attribute__((init_priority(101))) RuntimeRelease runtimeRelease;

}  // namespace

extern "C" BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID reserved) {
    if (reason == DLL_PROCESS_DETACH) runtimeRelease.Arm(module, reserved);
    return TRUE;
}

// The entry of a module that may be unloaded while the process goes on: each of ours.

#include <windows.h>

extern "C" const IMAGE_TLS_DIRECTORY _tls_used;  // the module's own, made by the linker

namespace __gnu_cxx {
void __freeres();  // of the C++ runtime; it has no header
}

namespace {

// The C++ runtime that is linked into a module keeps handles for a thread that uses it and gives them back when that
// thread ends, but not when the module goes before: a host that loads and unloads the library again and again would
// lose some each time. So the runtime is told that the unloading thread ends, which for the module is true.
class RuntimeRelease {
  public:
    // Call at DLL_PROCESS_DETACH; `reserved` is the entry's last argument, not null when the whole process ends:
    // then nothing has to be done.
    void Arm(HINSTANCE module, const void* reserved) noexcept {
        m_module = reserved == nullptr ? module : nullptr;
    }
    ~RuntimeRelease() {
        if (m_module == nullptr) return;
        const auto* callback = reinterpret_cast<const PIMAGE_TLS_CALLBACK*>(_tls_used.AddressOfCallBacks);
        for (; callback != nullptr && *callback != nullptr; ++callback) {
            (*callback)(m_module, DLL_THREAD_DETACH, nullptr);
        }
        // The memory that the runtime sets aside for throwing when there is none.
        __gnu_cxx::__freeres();
    }

  private:
    HINSTANCE m_module = nullptr;
};

// Made before and so destroyed after everything else in the module, which may still use the runtime.
__attribute__((init_priority(101))) RuntimeRelease runtimeRelease;

}  // namespace

extern "C" BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID reserved) {
    if (reason == DLL_PROCESS_DETACH) runtimeRelease.Arm(module, reserved);
    return TRUE;
}

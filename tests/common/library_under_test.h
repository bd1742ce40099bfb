// The library as a host uses it: on Windows the DLL, through its exports only; natively the same code linked in.
#pragma once

#include "api/host_api.h"

#if defined(_WIN32)
#include <windows.h>

#include <cstdio>
#include <cstdlib>
#endif

namespace velmora::testing {

#if defined(_WIN32)

class LoadedLibrary {
  public:
    LoadedLibrary() : LoadedLibrary(L"" VELMORA_DLL) {}
    explicit LoadedLibrary(const wchar_t* path) : m_module(LoadLibraryW(path)) {
        if (m_module == nullptr) {
            std::fprintf(stderr, "cannot load the DLL: %lu\n", GetLastError());
            std::abort();
        }
        getEffectsLibrary = Export<GetEffectsLibraryFunction>("GetEffectsLibrary");
        canUnload = Export<CanUnloadDLLNowFunction>("CanUnloadDLLNow");
    }
    ~LoadedLibrary() { FreeLibrary(m_module); }
    LoadedLibrary(const LoadedLibrary&) = delete;
    LoadedLibrary& operator=(const LoadedLibrary&) = delete;

    GetEffectsLibraryFunction getEffectsLibrary = nullptr;
    CanUnloadDLLNowFunction canUnload = nullptr;

  private:
    template <typename Function>
    Function Export(const char* name) const {
        return reinterpret_cast<Function>(reinterpret_cast<void*>(GetProcAddress(m_module, name)));
    }

    HMODULE m_module;
};

#else

extern "C" {
IEffectLibrary* GetEffectsLibrary();
bool CanUnloadDLLNow();
}

class LoadedLibrary {
  public:
    GetEffectsLibraryFunction getEffectsLibrary = GetEffectsLibrary;
    CanUnloadDLLNowFunction canUnload = CanUnloadDLLNow;
};

#endif

}  // namespace velmora::testing

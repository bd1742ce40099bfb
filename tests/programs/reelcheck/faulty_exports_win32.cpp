// On Windows the faulty library is a separate module, which loads the real one.

#include <windows.h>

#include "tests/programs/reelcheck/faulty_library.h"

namespace {

// The real library, next to the program that loads this one.
template <typename Function>
Function TrueExport(const char* name) {
    static const HMODULE module = LoadLibraryW(L"VMReelEffects.dll");
    return reinterpret_cast<Function>(reinterpret_cast<void*>(GetProcAddress(module, name)));
}

}  // namespace

extern "C" {

velmora::IEffectLibrary* VM_CALL GetEffectsLibrary() {
    return velmora::testing::MakeFaulty(
        TrueExport<velmora::GetEffectsLibraryFunction>("GetEffectsLibrary")());
}

bool VM_CALL CanUnloadDLLNow() {
    return velmora::testing::FaultIs("lets-go-early") ||
           TrueExport<velmora::CanUnloadDLLNowFunction>("CanUnloadDLLNow")();
}

}  // extern "C"

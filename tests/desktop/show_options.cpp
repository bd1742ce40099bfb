// Shows the options dialog of a library as a host does:   show_options.exe PATH-OF-VMReelEffects.dll
//
// For looking at the dialog and for driving it with a real mouse and keyboard (scripts/picture-options). Prints the
// dialog's result and the preference before and after.
#include <windows.h>

#include <cstdio>

#include "api/host_api.h"

int main(int count, char** arguments) {
    if (count != 2) return 2;
    const HMODULE module = LoadLibraryA(arguments[1]);
    if (module == nullptr) return 3;
    const auto getLibrary = reinterpret_cast<velmora::GetEffectsLibraryFunction>(
        reinterpret_cast<void*>(GetProcAddress(module, "GetEffectsLibrary")));
    velmora::IEffectLibrary* library = getLibrary();
    velmora::IShellServices* services = library->GetShellServices();
    const bool before = services->KnobsDragVertical();
    const int result = static_cast<int>(services->ShowOptions(nullptr));
    std::printf("result %d, vertical %d -> %d\n", result, before, services->KnobsDragVertical());
    library->Release();
    FreeLibrary(module);
    return 0;
}

#include <windows.h>

#include "library/module.h"
#include "platform/module_detach.h"

extern "C" BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID reserved) {
    if (reason == DLL_PROCESS_ATTACH) velmora::SetModuleHandle(module);
    if (reason == DLL_PROCESS_DETACH) velmora::support::runtimeRelease.Arm(module, reserved);
    return TRUE;
}

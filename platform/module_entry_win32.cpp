// The entry of a module that has nothing of its own to do there.
#include <windows.h>

#include "platform/module_detach.h"

extern "C" BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID reserved) {
    if (reason == DLL_PROCESS_DETACH) velmora::support::runtimeRelease.Arm(module, reserved);
    return TRUE;
}

// A module that holds the shell services alone, as the library holds them, so that tests can load it from folders of
// their choice, play the library objects and unload it.
#include <windows.h>

#include "platform/module_detach.h"
#include "desktop/shell_services.h"

namespace {
HINSTANCE ownModule = nullptr;
}

extern "C" {

BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID reserved) {
    if (reason == DLL_PROCESS_ATTACH) ownModule = module;
    if (reason == DLL_PROCESS_DETACH) velmora::support::runtimeRelease.Arm(module, reserved);
    return TRUE;
}

velmora::IShellServices* VM_CALL GetServices() {
    return &velmora::support::ShellServices();
}

void VM_CALL Offer(velmora::com::IUnknown* library) {
    velmora::support::OfferTextSource(ownModule, library, "VMReelEffects.chm");
}

void VM_CALL Withdraw(velmora::com::IUnknown* library) {
    velmora::support::WithdrawTextSource(library);
}
}

// A module with nothing but the shell services, linked as in the library, so that tests can load it from any folder,
// act as the library objects and unload it.
#include "desktop/shell_services.h"
#include "platform/platform.h"

extern "C" {

velmora::IShellServices* VM_CALL GetServices() {
    return &velmora::support::ShellServices();
}

void VM_CALL Offer(velmora::com::IUnknown* library) {
    velmora::support::OfferTextSource(velmora::support::OwnModule(), library, "VMReelEffects.chm");
}

void VM_CALL Withdraw(velmora::com::IUnknown* library) {
    velmora::support::WithdrawTextSource(library);
}
}

#include "library/module.h"

#include <new>

#include "platform/float_guard.h"
#include "effects/process_state.h"
#include "library/velmora_lib.h"

namespace velmora {
namespace {

support::ModuleHandle g_module = nullptr;

}  // namespace

support::ModuleHandle ModuleHandle() noexcept {
    return g_module;
}
void SetModuleHandle(support::ModuleHandle module) noexcept {
    g_module = module;
}

}  // namespace velmora

velmora::IEffectLibrary* VM_CALL GetEffectsLibrary() {
    const velmora::FloatGuard guard;
    velmora::SetBuildMode(velmora::kBuildModeReady);
    if (!velmora::RenewMasterSettings()) return nullptr;
    return new (std::nothrow) velmora::CRsVelmoraLib;
}

bool VM_CALL CanUnloadDLLNow() {
    return velmora::DLLDependentObject::LiveObjectCount() == 0;
}

#include "effects/velmora_effect.h"

#include "platform/float_guard.h"
#include "effects/process_state.h"

namespace velmora {

Status VM_CALL CRsVelmoraEffect::QueryInterface(const Guid* iid, void** out) {
    const Interface interfaces[] = {{&kIidUnknown, this}, {&kIidVideoEffect, this}};
    const Status status = FindInterface(interfaces, iid, out);
    if (status == kStatusOk) AddRef();
    return status;
}

std::uint32_t VM_CALL CRsVelmoraEffect::AddRef() {
    return m_references.Add();
}

std::uint32_t VM_CALL CRsVelmoraEffect::Release() {
    return m_references.Drop();
}

const char* VM_CALL CRsVelmoraEffect::GetName() {
    return "Reel Effects";
}
std::int32_t VM_CALL CRsVelmoraEffect::GetKind() {
    return 1;
}

bool VM_CALL CRsVelmoraEffect::GetParamInfo(std::uint32_t index, ParamDescriptor* descriptor) {
    const FloatGuard guard;
    MasterSettingsList* settings = CurrentMasterSettings();
    return settings != nullptr && descriptor != nullptr && settings->DescribeExposed(index, *descriptor);
}

bool VM_CALL CRsVelmoraEffect::Process(IVideoHost* host, const FrameRecord* source, void*,
                                       const FrameRecord* destination, const TimingRecord* timing) {
    const FloatGuard guard;
    const RenderSession session = ProcessSession(m_options);
    if (host == nullptr || session.settings == nullptr || BuildMode() != kBuildModeReady) return false;
    return RenderFrame(session, *host, source, destination, timing);
}

const char* VM_CALL CRsVelmoraEffect::GetPresetName(std::uint32_t) {
    return nullptr;
}
bool VM_CALL CRsVelmoraEffect::GetPresetValue(std::uint32_t, std::uint32_t, PresetCell*) {
    return false;
}

}  // namespace velmora

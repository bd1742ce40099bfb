// The renderer that all effects share, with the interface of an effect: it shows the master settings as its parameters
// and renders from them. Every effect contains one and acts as its host.
#pragma once

#include "api/com_object.h"
#include "api/host_api.h"
#include "effects/render_session.h"

namespace velmora {

class CRsVelmoraEffect final : public IVideoEffect {
  public:
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override;
    std::uint32_t VM_CALL AddRef() override;
    // Counts only: the storage belongs to the effect that contains this object.
    std::uint32_t VM_CALL Release() override;
    const char* VM_CALL GetName() override;
    std::int32_t VM_CALL GetKind() override;
    // The k-th setting of the current master settings list.
    bool VM_CALL GetParamInfo(std::uint32_t index, ParamDescriptor* descriptor) override;
    bool VM_CALL Process(IVideoHost* host, const FrameRecord* source, void* hostArgument,
                         const FrameRecord* destination, const TimingRecord* timing) override;
    const char* VM_CALL GetPresetName(std::uint32_t index) override;
    bool VM_CALL GetPresetValue(std::uint32_t preset, std::uint32_t parameter, PresetCell* cell) override;

  private:
    const render::RenderOptions m_options = ReadRenderOptions();
    ReferenceCount m_references;
};

}  // namespace velmora

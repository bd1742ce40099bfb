// The converter that the library offers hosts, between packed YCbCr 4:2:2 frames and 32-bit frames.
#pragma once

#include "api/com_object.h"
#include "api/host_api.h"
#include "effects/render_session.h"
#include "render/kernels.h"
#include "render/ycbcr.h"

namespace velmora {

class FrameProcessor final : public IFrameProcessor {
  public:
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override;
    std::uint32_t VM_CALL AddRef() override;
    std::uint32_t VM_CALL Release() override;
    bool VM_CALL Reserved3(const FrameRecord* source, const FrameRecord* destination,
                           std::uint8_t value) override;
    bool VM_CALL Reserved4(const FrameRecord* source, const FrameRecord* destination,
                           std::uint8_t value) override;
    bool VM_CALL Reserved5(const FrameRecord* source, const FrameRecord* destination,
                           std::uint8_t value) override;
    bool VM_CALL ConvertYcbcrToBgra(const FrameRecord* source, const FrameRecord* destination,
                                    std::uint8_t alpha) override;
    bool VM_CALL ConvertBgraToYcbcr(const FrameRecord* source, const FrameRecord* destination,
                                    std::uint8_t unused) override;

  private:
    const render::YcbcrKernels& m_kernels = *render::KernelsOf(ReadRenderOptions().level).ycbcr;
    render::PackedImage m_scratch;  // RGB
    ReferenceCount m_references;
};

}  // namespace velmora

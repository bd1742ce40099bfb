// The effects as hosts get them. To the host an effect is an IVideoEffect. To the renderer inside it, it acts as the
// host (IVideoHost) and answers the renderer's requests from its own parameters in the real host or with fixed values.
// Effects differ only in their tables.
//
// An effect does not need the library object that created it, but the library must stay loaded.
#pragma once

#include "effects/effect_table.h"
#include "api/com_object.h"
#include "api/host_api.h"
#include "effects/render_session.h"

namespace velmora {

// The renderer that all effects share, with the interface of an effect: it shows the master settings as its parameters
// and renders from them. Every effect contains one and acts as its host.
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

namespace velmora::effects {

template <const EffectTable& kTable>
class FilmEffect final : public IVideoEffect, public IVideoHost {
  public:
    // Shared by both interfaces. Identifiers that the effect does not know go to the attached host.
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override;
    std::uint32_t VM_CALL AddRef() override;
    std::uint32_t VM_CALL Release() override;

    // IVideoEffect
    const char* VM_CALL GetName() override;
    std::int32_t VM_CALL GetKind() override;
    bool VM_CALL GetParamInfo(std::uint32_t index, ParamDescriptor* descriptor) override;
    // Attaches `host`, without a reference, until the next call replaces it.
    bool VM_CALL Process(IVideoHost* host, const FrameRecord* source, void* hostArgument,
                         const FrameRecord* destination, const TimingRecord* timing) override;
    const char* VM_CALL GetPresetName(std::uint32_t index) override;
    bool VM_CALL GetPresetValue(std::uint32_t preset, std::uint32_t parameter, PresetCell* cell) override;

    // IVideoHost, for the renderer: `index` is a master setting.
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override;
    bool VM_CALL HostOperation4(std::intptr_t a, std::intptr_t b, std::intptr_t c) override;
    std::uint32_t VM_CALL HostOperation5(std::intptr_t a, std::intptr_t b) override;
    bool VM_CALL HostOperation6(std::intptr_t a, std::intptr_t b) override;
    void VM_CALL HostOperation7(std::intptr_t a, std::intptr_t b) override;

  private:
    CRsVelmoraEffect m_renderer;
    IVideoHost* m_host = nullptr;  // not counted
    ReferenceCount m_references;
};

// The class names do not match the names that users see: CFilmLook is "Film Pro".
using CFilmProjector = FilmEffect<kFilmCamera>;
using CFilmColor = FilmEffect<kFilmLook>;
using CFilmDamage = FilmEffect<kFilmDamage>;
using CFilmExpress = FilmEffect<kFilmExpress>;
using CFilmLook = FilmEffect<kFilmPro>;

extern template class FilmEffect<kFilmCamera>;
extern template class FilmEffect<kFilmLook>;
extern template class FilmEffect<kFilmDamage>;
extern template class FilmEffect<kFilmExpress>;
extern template class FilmEffect<kFilmPro>;

// A new effect with one reference that belongs to the caller; the index is the one in kAllEffects. Null past the last
// effect or when there is not enough memory.
[[nodiscard]] IVideoEffect* CreateEffectByIndex(std::uint32_t index) noexcept;

}  // namespace velmora::effects

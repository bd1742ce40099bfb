#include "effects/film_effect.h"

#include <new>

#include "effects/effect_queries.h"
#include "effects/process_state.h"
#include "platform/float_guard.h"

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
    if (host == nullptr || BuildMode() != kBuildModeReady) return false;
    const FrameSession frame(m_options);
    return frame.Session().settings != nullptr &&
           RenderFrame(frame.Session(), *host, source, destination, timing);
}

const char* VM_CALL CRsVelmoraEffect::GetPresetName(std::uint32_t) {
    return nullptr;
}
bool VM_CALL CRsVelmoraEffect::GetPresetValue(std::uint32_t, std::uint32_t, PresetCell*) {
    return false;
}

}  // namespace velmora

namespace velmora::effects {

template <const EffectTable& kTable>
Status VM_CALL FilmEffect<kTable>::QueryInterface(const Guid* iid, void** out) {
    IVideoEffect* const effect = this;
    IVideoHost* const asHost = this;
    const Interface interfaces[] = {
        {&kIidUnknown, effect}, {&kIidVideoEffect, effect}, {&kIidVideoHost, asHost}};
    // The host decides what `out` then holds.
    if (m_host != nullptr && out != nullptr && InterfaceOf(interfaces, iid) == nullptr) {
        return m_host->QueryInterface(iid, out);
    }
    const Status status = FindInterface(interfaces, iid, out);
    if (status == kStatusOk) AddRef();
    return status;
}

template <const EffectTable& kTable>
std::uint32_t VM_CALL FilmEffect<kTable>::AddRef() {
    return m_references.Add();
}

template <const EffectTable& kTable>
std::uint32_t VM_CALL FilmEffect<kTable>::Release() {
    const std::uint32_t left = m_references.Drop();
    if (left != 0) return left;
    const FloatGuard guard;
    delete this;
    return 0;
}

template <const EffectTable& kTable>
const char* VM_CALL FilmEffect<kTable>::GetName() {
    return kTable.name;
}

template <const EffectTable& kTable>
std::int32_t VM_CALL FilmEffect<kTable>::GetKind() {
    return m_renderer.GetKind();
}

template <const EffectTable& kTable>
bool VM_CALL FilmEffect<kTable>::GetParamInfo(std::uint32_t index, ParamDescriptor* descriptor) {
    const FloatGuard guard;
    return DescribeParam(kTable, index, descriptor);
}

template <const EffectTable& kTable>
bool VM_CALL FilmEffect<kTable>::Process(IVideoHost* host, const FrameRecord* source, void* hostArgument,
                                         const FrameRecord* destination, const TimingRecord* timing) {
    m_host = host;
    return m_renderer.Process(this, source, hostArgument, destination, timing);
}

template <const EffectTable& kTable>
const char* VM_CALL FilmEffect<kTable>::GetPresetName(std::uint32_t index) {
    return PresetName(kTable, index);
}

template <const EffectTable& kTable>
bool VM_CALL FilmEffect<kTable>::GetPresetValue(std::uint32_t preset, std::uint32_t parameter,
                                                PresetCell* cell) {
    return CopyPresetValue(kTable, preset, parameter, cell);
}

template <const EffectTable& kTable>
bool VM_CALL FilmEffect<kTable>::GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) {
    return AnswerMaster(kTable, m_host, index, cell, kind);
}

template <const EffectTable& kTable>
bool VM_CALL FilmEffect<kTable>::HostOperation4(std::intptr_t a, std::intptr_t b, std::intptr_t c) {
    return m_host != nullptr && m_host->HostOperation4(a, b, c);
}

template <const EffectTable& kTable>
std::uint32_t VM_CALL FilmEffect<kTable>::HostOperation5(std::intptr_t a, std::intptr_t b) {
    return m_host != nullptr ? m_host->HostOperation5(a, b) : 0;
}

template <const EffectTable& kTable>
bool VM_CALL FilmEffect<kTable>::HostOperation6(std::intptr_t, std::intptr_t) {
    return false;
}

template <const EffectTable& kTable>
void VM_CALL FilmEffect<kTable>::HostOperation7(std::intptr_t, std::intptr_t) {}

template class FilmEffect<kFilmCamera>;
template class FilmEffect<kFilmLook>;
template class FilmEffect<kFilmDamage>;
template class FilmEffect<kFilmExpress>;
template class FilmEffect<kFilmPro>;

IVideoEffect* CreateEffectByIndex(std::uint32_t index) noexcept {
    switch (index) {
        case 0:
            return new (std::nothrow) CFilmProjector;
        case 1:
            return new (std::nothrow) CFilmColor;
        case 2:
            return new (std::nothrow) CFilmDamage;
        case 3:
            return new (std::nothrow) CFilmExpress;
        case 4:
            return new (std::nothrow) CFilmLook;
        default:
            return nullptr;
    }
}

}  // namespace velmora::effects

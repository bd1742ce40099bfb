#include "hosts/reelhost/effect_library.h"

#include <stdexcept>

namespace velmora::hosts {
namespace {

constexpr wchar_t kFileName[] = L"VMReelEffects.dll";

std::wstring BesideThisProgram() {
    std::wstring path(32768, L'\0');
    path.resize(GetModuleFileNameW(nullptr, path.data(), static_cast<DWORD>(path.size())));
    return path.substr(0, path.find_last_of(L"\\/") + 1) + kFileName;
}

std::wstring Wide(const std::string& text) {
    std::wstring wide(text.size(), L'\0');
    const int count = MultiByteToWideChar(CP_ACP, 0, text.data(), static_cast<int>(text.size()), wide.data(),
                                          static_cast<int>(wide.size()));
    wide.resize(static_cast<std::size_t>(count));
    return wide;
}

EffectInfo Describe(IVideoEffect& effect) {
    EffectInfo info;
    info.name = effect.GetName();
    ParamDescriptor descriptor{};
    for (std::uint32_t i = 0; effect.GetParamInfo(i, &descriptor); ++i) {
        info.params.push_back(ReadDescriptor(descriptor));
        descriptor = {};
    }
    for (std::uint32_t i = 0; const char* name = effect.GetPresetName(i); ++i) {
        info.presets.emplace_back(name);
    }
    return info;
}

}  // namespace

EffectLibrary::EffectLibrary(const std::string& path) {
    m_tickBefore = GetTickCount();
    m_module.reset(LoadLibraryW(path.empty() ? BesideThisProgram().c_str() : Wide(path).c_str()));
    m_tickAfter = GetTickCount();
    if (!m_module) {
        throw std::runtime_error("VMReelEffects.dll cannot be loaded, system error " +
                                 std::to_string(GetLastError()));
    }
    void* const address = reinterpret_cast<void*>(GetProcAddress(m_module.get(), "GetEffectsLibrary"));
    if (!address) throw std::runtime_error("VMReelEffects.dll has no GetEffectsLibrary");
    m_library.reset(reinterpret_cast<GetEffectsLibraryFunction>(address)());
    if (!m_library) throw std::runtime_error("VMReelEffects.dll gives no library object");
    for (std::uint32_t i = 0; const Reference<IVideoEffect> effect{m_library->CreateEffect(i)}; ++i) {
        m_effects.push_back(Describe(*effect));
    }
}

Reference<IVideoEffect> EffectLibrary::CreateEffect(std::uint32_t index) const {
    Reference<IVideoEffect> effect(m_library->CreateEffect(index));
    if (!effect) throw std::runtime_error("VMReelEffects.dll cannot create the effect");
    return effect;
}

Reference<IFrameProcessor> EffectLibrary::CreateFrameProcessor() const {
    Reference<IFrameProcessor> processor(m_library->CreateFrameProcessor());
    if (!processor) throw std::runtime_error("VMReelEffects.dll cannot create the frame processor");
    return processor;
}

}  // namespace velmora::hosts

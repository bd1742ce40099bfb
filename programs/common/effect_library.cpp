#include "programs/common/effect_library.h"

#include <stdexcept>

#include "text/encodings.h"

namespace velmora::hosts {
namespace {

constexpr wchar_t kFileName[] = L"VMReelEffects.dll";

std::wstring BesideThisProgram() {
    std::wstring path(32768, L'\0');
    path.resize(GetModuleFileNameW(nullptr, path.data(), static_cast<DWORD>(path.size())));
    return path.substr(0, path.find_last_of(L"\\/") + 1) + kFileName;
}

// A library that describes for ever is not followed.
constexpr std::uint32_t kMostParams = kPresetCellCapacity, kMostPresets = 1000, kMostEffects = 100;

EffectInfo Describe(IVideoEffect& effect) {
    EffectInfo info;
    info.name = effect.GetName();
    ParamDescriptor descriptor{};
    for (std::uint32_t i = 0; i < kMostParams && effect.GetParamInfo(i, &descriptor); ++i) {
        info.params.push_back(ReadDescriptor(descriptor));
        descriptor = {};
    }
    for (std::uint32_t i = 0; i < kMostPresets; ++i) {
        const char* const name = effect.GetPresetName(i);
        if (name == nullptr) break;
        info.presets.emplace_back(name);
    }
    return info;
}

}  // namespace

std::wstring LibraryFile(const std::wstring& path) {
    return path.empty() ? BesideThisProgram() : path;
}

std::wstring LibraryFile(const std::string& path) {
    if (path.empty()) return BesideThisProgram();
    const std::u16string wide = Widen(path);
    return {wide.begin(), wide.end()};
}

EffectLibrary::EffectLibrary(const std::string& path) : EffectLibrary(LibraryFile(path)) {}

EffectLibrary::EffectLibrary(const std::wstring& file) {
    m_tickBefore = GetTickCount();
    m_module.reset(LoadLibraryW(file.c_str()));
    m_tickAfter = GetTickCount();
    if (!m_module) {
        throw std::runtime_error("VMReelEffects.dll cannot be loaded, system error " +
                                 std::to_string(GetLastError()));
    }
    void* const address = reinterpret_cast<void*>(GetProcAddress(m_module.get(), "GetEffectsLibrary"));
    if (!address) throw std::runtime_error("VMReelEffects.dll has no GetEffectsLibrary");
    m_library = Reference<IEffectLibrary>::Adopt(reinterpret_cast<GetEffectsLibraryFunction>(address)());
    if (!m_library) throw std::runtime_error("VMReelEffects.dll gives no library object");
    for (std::uint32_t i = 0; i < kMostEffects; ++i) {
        const auto effect = Reference<IVideoEffect>::Adopt(m_library->CreateEffect(i));
        if (!effect) break;
        m_effects.push_back(Describe(*effect));
    }
}

Reference<IVideoEffect> EffectLibrary::CreateEffect(std::uint32_t index) const {
    auto effect = Reference<IVideoEffect>::Adopt(m_library->CreateEffect(index));
    if (!effect) throw std::runtime_error("VMReelEffects.dll cannot create the effect");
    return effect;
}

Reference<IFrameProcessor> EffectLibrary::CreateFrameProcessor() const {
    auto processor = Reference<IFrameProcessor>::Adopt(m_library->CreateFrameProcessor());
    if (!processor) throw std::runtime_error("VMReelEffects.dll cannot create the frame processor");
    return processor;
}

}  // namespace velmora::hosts

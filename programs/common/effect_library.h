// VMReelEffects.dll as an editor has it: found beside the program, loaded by LoadLibrary, used through its exports and
// interfaces alone. Windows only.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "api/reference.h"
#include "programs/common/effect_info.h"

#include <windows.h>

namespace velmora::hosts {

// The file of the library. `path` is in the system's code page, as the command line gave it; empty: VMReelEffects.dll
// beside this program.
[[nodiscard]] std::wstring LibraryFile(const std::string& path);
// The same for a path in 16-bit text.
[[nodiscard]] std::wstring LibraryFile(const std::wstring& path);

class EffectLibrary {
  public:
    // `path` empty: the DLL beside this program. Throws std::runtime_error when it cannot be loaded.
    explicit EffectLibrary(const std::string& path);
    explicit EffectLibrary(const std::wstring& file);

    [[nodiscard]] const std::vector<EffectInfo>& Effects() const { return m_effects; }
    // Both throw std::runtime_error when the library gives none.
    [[nodiscard]] Reference<IVideoEffect> CreateEffect(std::uint32_t index) const;
    [[nodiscard]] Reference<IFrameProcessor> CreateFrameProcessor() const;

    [[nodiscard]] IEffectLibrary& Object() const { return *m_library; }

    // Tick counts just before and just after loading: the library's random sequence began in between.
    [[nodiscard]] std::uint32_t TickBefore() const { return m_tickBefore; }
    [[nodiscard]] std::uint32_t TickAfter() const { return m_tickAfter; }

  private:
    struct FreeModule {
        void operator()(HMODULE module) const { FreeLibrary(module); }
    };

    std::unique_ptr<HINSTANCE__, FreeModule> m_module;  // outlives what it made
    Reference<IEffectLibrary> m_library;
    std::vector<EffectInfo> m_effects;
    std::uint32_t m_tickBefore = 0, m_tickAfter = 0;
};

}  // namespace velmora::hosts

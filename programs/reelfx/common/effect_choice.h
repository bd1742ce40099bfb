// The effect and settings that a command applies, and the sessions that render it.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "effects/effect_session.h"
#include "programs/common/effect_info.h"
#include "programs/common/settings.h"

namespace velmora::hosts {

struct EffectOptions {
    std::string effect = {};  // may be empty if a preset file names it
    std::optional<std::string> preset = {};
    std::optional<std::string> presetFile = {};  // applied after the preset
    std::vector<std::string> settings = {};      // "NAME=VALUE", applied last
    std::uint32_t seed = 0;
    // Use one continuous random sequence from this state, as a host that plays a clip through the library
    // does, instead of numbers that depend on seed and frame.
    std::optional<std::uint32_t> randomState = {};
};

// The five effects as the core describes them, in the library's order.
const std::vector<EffectInfo>& CoreEffects();

class EffectChoice {
  public:
    // Throws UsageError when the effect, the preset or a setting does not exist or does not fit, Failure when
    // the preset file cannot be read or belongs to another effect.
    explicit EffectChoice(const EffectOptions& options);

    [[nodiscard]] const EffectInfo& Info() const { return *m_info; }
    // The chosen built-in preset; nothing when none was named.
    [[nodiscard]] std::optional<std::uint32_t> Preset() const { return m_preset; }
    // Frames must come in order and to one session only.
    [[nodiscard]] bool IsSequence() const { return m_options.randomState.has_value(); }
    // Each thread needs its own. `preset` replaces the chosen preset and all settings.
    [[nodiscard]] std::unique_ptr<effects::EffectSession> NewSession(
        std::optional<std::uint32_t> preset = std::nullopt) const;

  private:
    EffectOptions m_options;
    std::size_t m_index;
    const EffectInfo* m_info;
    std::optional<std::uint32_t> m_preset;
    std::vector<Setting> m_settings;  // those of the preset file, then those given with --set
};

}  // namespace velmora::hosts

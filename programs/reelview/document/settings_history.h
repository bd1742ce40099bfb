// What the user can undo: the selected effect and the settings of every effect.
#pragma once

#include <cstdint>
#include <cstddef>
#include <vector>

#include "programs/common/effect_info.h"
#include "api/host_api.h"

namespace velmora::reelview {

using Values = std::vector<ValueWord>;  // by parameter; group markers hold 0

struct Settings {
    std::uint32_t effect = 0;
    std::vector<Values> values;  // by effect

    [[nodiscard]] const Values& Current() const { return values[effect]; }
    [[nodiscard]] bool operator==(const Settings& other) const;
};

[[nodiscard]] Values DefaultsOf(const hosts::EffectInfo& effect);
[[nodiscard]] bool ValuesAreEqual(const Values& a, const Values& b);

class SettingsHistory {
  public:
    // Every effect at its defaults; there must be at least one effect.
    explicit SettingsHistory(const std::vector<hosts::EffectInfo>& effects);

    [[nodiscard]] const Settings& Now() const { return m_states[m_now]; }

    void ChooseEffect(std::uint32_t effect);
    void SetAll(const Values& values);
    // Changes of one parameter with the same non-zero gesture number form one step, so a drag is undone in one go.
    void Set(std::uint32_t parameter, ValueWord value, std::uint32_t gesture);

    [[nodiscard]] bool CanUndo() const { return m_now > 0; }
    [[nodiscard]] bool CanRedo() const { return m_now + 1 < m_states.size(); }
    void Undo();
    void Redo();

  private:
    void Push(Settings next);

    std::vector<Settings> m_states;
    std::size_t m_now = 0;
    std::uint32_t m_gesture = 0, m_gestureParameter = 0;
};

}  // namespace velmora::reelview

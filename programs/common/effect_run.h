// An effect at work with settings that this program keeps, as an editor keeps what its controls show.
#pragma once

#include <cstdint>
#include <vector>

#include "text/number_text.h"
#include "programs/common/settings.h"
#include "programs/common/effect_library.h"
#include "api/host_api.h"

namespace velmora::hosts {

// The host's side of a running effect: answers what the effect asks while it renders.
class SettingsHost final : public PlainHost {
  public:
    explicit SettingsHost(std::vector<ValueWord> values) : m_values(std::move(values)) {}

    void SetValue(std::uint32_t parameter, ValueWord value) { m_values[parameter] = value; }

    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override;

  private:
    std::vector<ValueWord> m_values;  // by parameter
};

class EffectRun {
  public:
    // With the parameters' defaults.
    EffectRun(const EffectLibrary& library, std::uint32_t effect);

    void ApplyPreset(std::uint32_t preset);
    void Set(const Setting& setting) { m_host.SetValue(setting.parameter, setting.value); }
    [[nodiscard]] const EffectInfo& Info() const { return m_info; }

    // Both are size.width * size.height * 4 bytes. Throws std::runtime_error when the effect refuses.
    void Render(FrameSize size, const std::vector<std::uint8_t>& source, std::vector<std::uint8_t>& result,
                double seconds);
    // The same with frame records of the caller's.
    void Render(const FrameRecord& source, const FrameRecord& result, double seconds);

  private:
    const EffectInfo& m_info;
    Reference<IVideoEffect> m_effect;
    SettingsHost m_host;
};

}  // namespace velmora::hosts

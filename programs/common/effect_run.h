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
class SettingsHost final : public IVideoHost {
  public:
    explicit SettingsHost(std::vector<ValueWord> values) : m_values(std::move(values)) {}
    virtual ~SettingsHost() = default;

    void SetValue(std::uint32_t parameter, ValueWord value) { m_values[parameter] = value; }

    Status VM_CALL QueryInterface(const Guid* iid, void** out) override;
    std::uint32_t VM_CALL AddRef() override { return 1; }  // lives as long as its EffectRun
    std::uint32_t VM_CALL Release() override { return 1; }
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override;
    bool VM_CALL HostOperation4(std::intptr_t, std::intptr_t, std::intptr_t) override { return false; }
    std::uint32_t VM_CALL HostOperation5(std::intptr_t, std::intptr_t) override { return 0; }
    bool VM_CALL HostOperation6(std::intptr_t, std::intptr_t) override { return false; }
    void VM_CALL HostOperation7(std::intptr_t, std::intptr_t) override {}

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

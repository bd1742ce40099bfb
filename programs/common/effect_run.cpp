#include "programs/common/effect_run.h"

#include <stdexcept>

namespace velmora::hosts {
namespace {

std::vector<ValueWord> DefaultsOf(const EffectInfo& info) {
    std::vector<ValueWord> values;
    for (const ParamInfo& param : info.params) values.push_back(param.defaultValue);
    return values;
}

}  // namespace

bool VM_CALL SettingsHost::GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) {
    if (index >= m_values.size() || !cell) return false;
    cell->value = m_values[index];
    cell->kind = kind;
    return true;
}

EffectRun::EffectRun(const EffectLibrary& library, std::uint32_t effect)
    : m_info(library.Effects().at(effect)),
      m_effect(library.CreateEffect(effect)),
      m_host(DefaultsOf(m_info)) {}

void EffectRun::ApplyPreset(std::uint32_t preset) {
    for (std::uint32_t i = 0; i < m_info.params.size(); ++i) {
        PresetCell cell{};
        if (!m_info.params[i].HoldsValue() || !m_effect->GetPresetValue(preset, i, &cell)) continue;
        m_host.SetValue(i, cell.value);
    }
}

void EffectRun::Render(FrameSize size, const std::vector<std::uint8_t>& source,
                       std::vector<std::uint8_t>& result, double seconds) {
    // The records are the host's; the effect does not write to the source.
    void* const sourcePixels = const_cast<std::uint8_t*>(source.data());
    const FrameRecord from = {sourcePixels, size.width, size.height, size.width * 4, 0, 0, 0};
    const FrameRecord to = {result.data(), size.width, size.height, size.width * 4, 0, 0, 0};
    Render(from, to, seconds);
}

void EffectRun::Render(const FrameRecord& source, const FrameRecord& result, double seconds) {
    const TimingRecord timing = {0.0, 0.0, seconds};
    if (!m_effect->Process(&m_host, &source, nullptr, &result, &timing)) {
        throw std::runtime_error("the effect does not render this frame");
    }
}

}  // namespace velmora::hosts
